// The editor's share facet over fakes of the store, the sheet, the extension
// registry and publishing support: the sheet's items, its activities and
// their order, its presentation, and what its completion records.

#include "ShareFakes.h"
#include "platform/services/ActivityTypes.h"
#include "platform/ui/Device.h"
#include "platform/ui/Window.h"
#include "support/Wait.h"
#include "unit/editor/EditorOnFakes.h"
#include "youtube/TXYouTubeActivity.h"

using namespace platform;
using testing_support::waitUntil;

namespace {

class EditorShareTest : public EditorOnFakes {
  protected:
    void SetUp() override {
        EditorOnFakes::SetUp();
        store->response.results = {testing_support::storeItem(
            "Racer", "Example Games", "https://store.example/apps/org.example.Racer")};
    }
    void TearDown() override {
        if (editor && editor->presentedViewController())
            editor->dismissViewControllerAnimated_completion(false);
        waitUntil([] { return false; }, 20);
        window.reset();
        EditorOnFakes::TearDown();
    }

    // Makes the editor, shows it in a window of `size`, and waits until it
    // is on screen.
    void show(QSize size = QSize(900, 600)) {
        makeEditor();
        window = std::make_unique<Window>();
        window->resize(size);
        window->setRootViewController(editor);
        window->show();
        ASSERT_TRUE(waitUntil(
            [&] { return editor->appearance() == ViewController::Appearance::Appeared; }));
    }

    // Taps share and waits for the sheet.
    std::shared_ptr<testing_support::FakeActivitySheet> share() {
        const auto before = testing_support::FakeActivitySheet::made().size();
        editor->shareAction();
        waitUntil([&] {
            return testing_support::FakeActivitySheet::made().size() > before &&
                   editor->presentedViewController() == sheets.last().get();
        });
        return testing_support::FakeActivitySheet::made().size() > before ? sheets.last() : nullptr;
    }

    testing_support::ScopedEnv language{"LANGUAGE", "en"};
    testing_support::ScopedEnv locale{"LC_ALL", "en_US.UTF-8"};
    std::shared_ptr<testing_support::FakeStoreLookup> store =
        std::make_shared<testing_support::FakeStoreLookup>();
    std::shared_ptr<testing_support::FakeExtensionRegistry> extensions =
        std::make_shared<testing_support::FakeExtensionRegistry>();
    std::shared_ptr<testing_support::FakePublishingSupport> publishing =
        std::make_shared<testing_support::FakePublishingSupport>();
    Implementation<StoreLookup::Maker>::Replacement r1 =
        StoreLookup::implementation().replace([this] { return store; });
    Implementation<ExtensionRegistry::Maker>::Replacement r2 =
        ExtensionRegistry::implementation().replace([this] { return extensions; });
    Implementation<PublishingSupport::Maker>::Replacement r3 =
        PublishingSupport::implementation().replace([this] { return publishing; });
    testing_support::FakeSheets sheets;
    std::unique_ptr<Window> window;
};

} // namespace

TEST_F(EditorShareTest, SharesTheStoreTextTheLinkAndTheRecording) {
    show();
    testing_support::LogCapture log;
    const auto sheet = share();
    ASSERT_TRUE(sheet);
    EXPECT_EQ(
        sheet->activityItems(),
        (QVariantList{QStringLiteral("Check out my recording of Racer by Example Games!"),
                      QStringLiteral("https://store.example/apps/org.example.Racer"), recording}));
    EXPECT_EQ(log.count("displayShareSheetWithVideoURL"), 1);
    EXPECT_EQ(store->requests().size(), 1);
    EXPECT_EQ(sheet->excludedActivityTypes(), QStringList{CopyToPasteboardActivityType});
    EXPECT_TRUE(sheet->applicationActivities().isEmpty()) << "no publishing support here";
    EXPECT_TRUE(sheet->preferredActivityOrder().isEmpty());
    EXPECT_TRUE(sheet->hasCompletionWithItemsHandler());
    // The wide layout: a popover at the share item.
    EXPECT_EQ(sheet->modalPresentationStyle(), ViewController::ModalPresentationStyle::Popover);
    EXPECT_EQ(sheet->popoverItem(), editor->shareButton);
}

TEST_F(EditorShareTest, AnOverrideMessageIsTheOnlyTextAndTheAttachmentComesLast) {
    show();
    editor->overrideShareMessage = "Look at this";
    editor->fileAttachmentURL = QUrl::fromLocalFile(QStringLiteral("/recordings/notes.txt"));
    const auto sheet = share();
    ASSERT_TRUE(sheet);
    EXPECT_EQ(sheet->activityItems(),
              (QVariantList{QStringLiteral("Look at this"), recording,
                            QUrl::fromLocalFile(QStringLiteral("/recordings/notes.txt"))}));
    EXPECT_EQ(store->requests().size(), 1) << "the details are fetched all the same";

    sheet->finish(QString(), false);
    editor->overrideShareMessage = "";
    const auto again = share();
    ASSERT_TRUE(again);
    EXPECT_EQ(again->activityItems().first(), QStringLiteral(""))
        << "an empty message is a message";
    EXPECT_EQ(again->activityItems().size(), 3);
}

TEST_F(EditorShareTest, WithoutAnAuthorTheTextIsTheNameAloneAndWithoutALinkNoLink) {
    store->response.results = {testing_support::storeItem("Notes", "", QString())};
    show();
    auto sheet = share();
    ASSERT_TRUE(sheet);
    EXPECT_EQ(sheet->activityItems(), (QVariantList{QStringLiteral("Notes"), recording}));

    sheet->finish(QString(), false);
    store->response.results = {};
    sheet = share();
    ASSERT_TRUE(sheet);
    EXPECT_EQ(sheet->activityItems().first(), QStringLiteral(""))
        << "no details and no installed application: an empty text";
}

TEST_F(EditorShareTest, YouTubeIsOfferedOnlyWithoutItsOwnExtensionAndWithSupport) {
    show();
    publishing->present = true;
    extensions->installed.insert(ExtensionRegistry::youTubeShareExtensionIdentifier, true);
    auto sheet = share();
    ASSERT_TRUE(sheet);
    EXPECT_TRUE(sheet->applicationActivities().isEmpty()) << "the YouTube application shares";
    EXPECT_TRUE(sheet->preferredActivityOrder().isEmpty());
    sheet->finish(QString(), false);

    extensions->installed.insert(ExtensionRegistry::youTubeShareExtensionIdentifier, false);
    sheet = share();
    ASSERT_TRUE(sheet);
    ASSERT_EQ(sheet->applicationActivities().size(), 1) << "a disabled extension does not count";
    EXPECT_TRUE(dynamic_cast<TXYouTubeActivity*>(sheet->applicationActivities().first().get()));
    EXPECT_EQ(sheet->preferredActivityOrder(),
              (QStringList{MailActivityType, MessageActivityType, "TXPublishToYouTube",
                           CopyToPasteboardActivityType, PostToFacebookActivityType}));
    EXPECT_EQ(sheet->excludedActivityTypes(), QStringList{CopyToPasteboardActivityType})
        << "copy stays excluded although it is preferred";
    sheet->finish(QString(), false);

    publishing->present = false;
    extensions->installed.clear();
    sheet = share();
    ASSERT_TRUE(sheet);
    EXPECT_TRUE(sheet->applicationActivities().isEmpty()) << "no plug-in, no YouTube";
}

TEST_F(EditorShareTest, AfterATrimmedSaveTheRecordingAsReceivedIsShared) {
    show();
    // What the trimmed save's completion does: the player moves to the clip.
    const QUrl clip = QUrl::fromLocalFile(QStringLiteral("/clips/Racer_T.mp4"));
    fakes.world().addMovie(clip, fakes::FakeMovie{});
    editor->reloadAVLayerWithURL(clip);
    ASSERT_EQ(editor->videoURL, clip);
    const auto sheet = share();
    ASSERT_TRUE(sheet);
    EXPECT_EQ(sheet->activityItems().last(), recording);
}

TEST_F(EditorShareTest, CompletedActivitiesAreRecordedEachTimeAndOthersNot) {
    show();
    auto sheet = share();
    ASSERT_TRUE(sheet);
    sheet->finish(MailActivityType, true);
    sheet = share();
    ASSERT_TRUE(sheet);
    sheet->finish(MailActivityType, true);
    sheet = share();
    ASSERT_TRUE(sheet);
    sheet->finish(MessageActivityType, false);
    sheet = share();
    ASSERT_TRUE(sheet);
    sheet->cancel();
    EXPECT_EQ(editor->activityTypes, (QStringList{MailActivityType, MailActivityType}));
    EXPECT_EQ(editor->presentedViewController(), nullptr) << "the editing goes on";

    editor->doneAction();
    ASSERT_EQ(delegate->reports.size(), 1);
    EXPECT_EQ(delegate->reports.first(), (QStringList{MailActivityType, MailActivityType}));
}

TEST_F(EditorShareTest, OnATabletInIntroModeTheToolbarHasNoPlayButtonAndDoneLeads) {
    show();
    ASSERT_TRUE(editor->isPadMode());
    ASSERT_TRUE(editor->isIntroMode());
    ASSERT_TRUE(share());
    EXPECT_EQ(editor->topToolBar->items(),
              (Toolbar::ItemList{editor->doneButton, editor->flexSpace, editor->titleButton,
                                 editor->flexSpace, editor->fixSpace, editor->shareButton,
                                 editor->fixSpace, editor->saveButton}));
    sheets.last()->cancel();

    editor->setIntroMode(false);
    ASSERT_TRUE(share());
    EXPECT_EQ(editor->topToolBar->items(),
              (Toolbar::ItemList{editor->doneButton, editor->flexSpace, editor->titleButton,
                                 editor->flexSpace, editor->playButton, editor->fixSpace,
                                 editor->shareButton, editor->fixSpace, editor->saveButton}));
}

TEST_F(EditorShareTest, OnAPhoneTheSheetFillsTheWindow) {
    Device::setInterfaceIdiomOverride(Device::InterfaceIdiom::Phone);
    show(QSize(390, 700));
    ASSERT_FALSE(editor->isPadMode());
    const auto bottom = editor->bottomToolBar->items();
    const auto sheet = share();
    ASSERT_TRUE(sheet);
    EXPECT_EQ(sheet->modalPresentationStyle(), ViewController::ModalPresentationStyle::FullScreen);
    EXPECT_EQ(editor->topToolBar->items(),
              (Toolbar::ItemList{editor->doneButton, editor->flexSpace, editor->titleButton,
                                 editor->flexSpace, editor->saveButton}));
    EXPECT_EQ(editor->bottomToolBar->items(), bottom);
}
