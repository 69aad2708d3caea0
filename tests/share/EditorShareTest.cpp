// The editor's share facet over fakes of the store, the sheet, the extension
// registry and publishing support: the sheet's items, its activities and
// their order, its presentation, and what its completion records.

#include "ShareFakes.h"
#include "platform/services/ActivityTypes.h"
#include "platform/ui/Window.h"
#include "support/Wait.h"
#include "unit/editor/EditorOnFakes.h"
#include "youtube/TXYouTubeActivity.h"

using namespace platform;
using namespace testing_support;

namespace {

class EditorShareTest : public EditorOnFakes {
  protected:
    void SetUp() override {
        EditorOnFakes::SetUp();
        store->response.results = {
            storeItem("Racer", "Example Games", "https://store.example/apps/org.example.Racer")};
    }
    void TearDown() override {
        if (editor && editor->presentedViewController())
            editor->dismissViewControllerAnimated_completion(false);
        waitUntil([] { return false; }, 20);
        window.reset();
        EditorOnFakes::TearDown();
    }

    // Makes the editor and waits until it is on screen in a wide window.
    void show() {
        makeEditor();
        window = std::make_unique<Window>();
        window->resize(900, 600);
        window->setRootViewController(editor);
        window->show();
        ASSERT_TRUE(waitUntil(
            [&] { return editor->appearance() == ViewController::Appearance::Appeared; }));
    }

    // Taps share and waits for the sheet; the sheet before it ends first, as
    // `finishing` says (a null type cancels).
    std::shared_ptr<FakeActivitySheet> share(const QString& finishing = QString(),
                                             bool completed = false) {
        if (!sheets.made.isEmpty())
            sheets.made.last()->finish(finishing, completed);
        const auto before = sheets.made.size();
        editor->shareAction();
        waitUntil([&] {
            return sheets.made.size() > before &&
                   editor->presentedViewController() == sheets.made.last().get();
        });
        return sheets.made.size() > before ? sheets.made.last() : nullptr;
    }

    ScopedEnv language{"LANGUAGE", "en"};
    ScopedEnv locale{"LC_ALL", "en_US.UTF-8"};
    InPlace<StoreLookup, FakeStoreLookup> store;
    InPlace<ExtensionRegistry, FakeExtensionRegistry> extensions;
    InPlace<PublishingSupport, FakePublishingSupport> publishing;
    FakeSheets sheets;
    std::unique_ptr<Window> window;
};

} // namespace

TEST_F(EditorShareTest, TheTextIsTheOverrideMessageOrTheNameAloneWithoutAnAuthor) {
    show();
    editor->overrideShareMessage = "Look at this";
    editor->fileAttachmentURL = QUrl::fromLocalFile(QStringLiteral("/recordings/notes.txt"));
    EXPECT_EQ(share()->activityItems(),
              (QVariantList{QStringLiteral("Look at this"), recording,
                            QUrl::fromLocalFile(QStringLiteral("/recordings/notes.txt"))}));
    EXPECT_EQ(store->requests.size(), 1) << "the details are fetched all the same";
    editor->overrideShareMessage = "";
    EXPECT_EQ(share()->activityItems().value(0), QStringLiteral(""))
        << "an empty message is a message";
    EXPECT_EQ(sheets.made.last()->activityItems().size(), 3);

    editor->overrideShareMessage = QString();
    editor->fileAttachmentURL = QUrl();
    store->response.results = {storeItem("Notes", "", QString())};
    EXPECT_EQ(share()->activityItems(), (QVariantList{QStringLiteral("Notes"), recording}))
        << "no author: the name alone; no link: no link item";
    store->response.results = {};
    EXPECT_EQ(share()->activityItems(), (QVariantList{QStringLiteral(""), recording}))
        << "no details and no installed application: an empty text";
}

TEST_F(EditorShareTest, YouTubeIsOfferedOnlyWithoutItsOwnExtensionAndWithSupport) {
    show();
    publishing->present = true;
    extensions->installed.insert(ExtensionRegistry::youTubeShareExtensionIdentifier, true);
    auto sheet = share();
    EXPECT_TRUE(sheet->applicationActivities().isEmpty()) << "the YouTube application shares";
    EXPECT_TRUE(sheet->preferredActivityOrder().isEmpty());
    EXPECT_EQ(sheet->excludedActivityTypes(), QStringList{CopyToPasteboardActivityType});

    extensions->installed.insert(ExtensionRegistry::youTubeShareExtensionIdentifier, false);
    sheet = share();
    ASSERT_EQ(sheet->applicationActivities().size(), 1) << "a disabled extension does not count";
    EXPECT_TRUE(dynamic_cast<TXYouTubeActivity*>(sheet->applicationActivities().first().get()));
    EXPECT_EQ(sheet->preferredActivityOrder(),
              (QStringList{MailActivityType, MessageActivityType, "TXPublishToYouTube",
                           CopyToPasteboardActivityType, PostToFacebookActivityType}));
    EXPECT_EQ(sheet->excludedActivityTypes(), QStringList{CopyToPasteboardActivityType})
        << "copy stays excluded although it is preferred";

    publishing->present = false;
    extensions->installed.clear();
    EXPECT_TRUE(share()->applicationActivities().isEmpty()) << "no plug-in, no YouTube";
}

// The store's text and link, and the recording as received even after a
// trimmed save, in a popover at the share item of the wide layout.
TEST_F(EditorShareTest, SharesTheStoreTextTheLinkAndTheRecordingAsReceived) {
    show();
    // What the trimmed save's completion does: the player moves to the clip.
    const QUrl clip = QUrl::fromLocalFile(QStringLiteral("/clips/Racer_T.mp4"));
    fakes.world().addMovie(clip, fakes::FakeMovie{});
    editor->reloadAVLayerWithURL(clip);
    ASSERT_EQ(editor->videoURL, clip);
    const auto sheet = share();
    ASSERT_TRUE(sheet);
    EXPECT_EQ(
        sheet->activityItems(),
        (QVariantList{QStringLiteral("Check out my recording of Racer by Example Games!"),
                      QStringLiteral("https://store.example/apps/org.example.Racer"), recording}));
    EXPECT_EQ(sheet->modalPresentationStyle(), ViewController::ModalPresentationStyle::Popover);
    EXPECT_EQ(sheet->popoverItem(), editor->shareButton);

    // On a tablet in intro mode the toolbar has no play button; done leads.
    ASSERT_TRUE(editor->isIntroMode());
    EXPECT_EQ(top(), "done | title | - share - save");
    editor->setIntroMode(false);
    ASSERT_TRUE(share());
    EXPECT_EQ(top(), "done | title | play - share - save");
}

TEST_F(EditorShareTest, CompletedActivitiesAreRecordedEachTimeAndOthersNot) {
    show();
    share();
    share(MailActivityType, true);
    share(MailActivityType, true);
    share(MessageActivityType, false);
    sheets.made.last()->cancel();
    EXPECT_EQ(editor->activityTypes, (QStringList{MailActivityType, MailActivityType}));
    EXPECT_EQ(editor->presentedViewController(), nullptr) << "the editing goes on";

    editor->doneAction();
    EXPECT_EQ(delegate->reports, (QList<QStringList>{{MailActivityType, MailActivityType}}));
}
