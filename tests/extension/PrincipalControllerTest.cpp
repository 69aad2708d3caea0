// The principal view controller: the host's input items in, an editor out,
// and the editor's report back to the host.

#include "MediaGenerator.h"
#include "extension/TXVideoEditorExtensionKeys.h"
#include "extension/TXVideoEditorExtensionViewController.h"
#include "platform/hosting/MessageChannel.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/MainQueue.h"
#include "support/LogCapture.h"
#include "support/TempDir.h"
#include "support/Wait.h"

#include <QCborArray>
#include <QColor>
#include <QTemporaryDir>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::waitUntil;

namespace {

ExtensionItem item(const QString& title, const QVariant& value) {
    return {title, {ItemProvider::withItem(value)}};
}

class PrincipalTest : public ::testing::Test {
  protected:
    static void SetUpTestSuite() {
        qputenv("TAMSEL_AUDIO", "null");
        media = new QTemporaryDir;
        testmedia::MovieSpec movieSpec;
        movieSpec.seconds = 1;
        ASSERT_TRUE(testmedia::writeMovie(movie(), movieSpec));
    }
    static void TearDownTestSuite() { delete media; }
    static QString movie() { return media->filePath("rec.mp4"); }

    void TearDown() override {
        principal.reset();
        context.reset();
        GlobalQueue::drain();
        MainQueue::runPending();
    }

    // A request with these items, its host end on `host`.
    void request(const QList<ExtensionItem>& items) {
        root.makeLibrary();
        auto [extensionEnd, hostEnd] = makeSocketPair();
        host = std::make_unique<MessageChannel>(hostEnd);
        host->onMessage = [this](const QCborMap& m) {
            reports.append(m.value("arguments").toArray().at(0).toArray());
        };
        auto connection = std::make_shared<AuxiliaryConnection>(
            std::make_shared<MessageChannel>(extensionEnd),
            TXVideoEditorExtensionContext::_extensionAuxiliaryVendorProtocol(),
            TXVideoEditorExtensionContext::_extensionAuxiliaryHostProtocol());
        context = std::make_shared<TXVideoEditorExtensionContext>(items, connection);
        principal = TXVideoEditorExtensionViewController::create();
        principal->extensionContext = context;
        context->setPrincipalObject(principal);
        principal->view(); // loads: the loads of the items start
    }

    QList<ExtensionItem> required() const {
        return {item(TXVideoEditorExtensionBundleIdentifierKey, "org.example.Racer"),
                item(TXVideoEditorExtensionAppNameKey, "Racer"),
                item(TXVideoEditorExtensionMoviePathKey, movie())};
    }

    static QTemporaryDir* media;
    testing_support::MobileRoot root;
    testing_support::LogCapture logs;
    std::unique_ptr<MessageChannel> host;
    std::shared_ptr<TXVideoEditorExtensionContext> context;
    std::shared_ptr<TXVideoEditorExtensionViewController> principal;
    QList<QCborArray> reports;
};
QTemporaryDir* PrincipalTest::media = nullptr;

} // namespace

TEST_F(PrincipalTest, TheRequiredItemsBuildAnEditorWithEveryValue) {
    request(required() +
            QList<ExtensionItem>{
                item(TXVideoEditorExtensionFileAttachmentKey, "/home/me/notes.txt"),
                item(TXVideoEditorExtensionOverrideShareMessageKey, "Look!"),
                item(TXVideoEditorExtensionOverrideTintColorKey, QColor(10, 200, 30))});
    // Every load after the three required ones builds the editor again, so
    // the last editor has every value.
    ASSERT_TRUE(waitUntil([&] {
        const auto& e = principal->videoEditorViewController;
        return e && !e->fileAttachmentURL.isEmpty() && !e->overrideShareMessage.isEmpty() &&
               e->topToolBar->tintColor().isValid();
    }));
    const auto& editor = principal->videoEditorViewController;
    EXPECT_EQ(editor->applicationName, "Racer");
    EXPECT_EQ(editor->bundleIdentifier, "org.example.Racer");
    EXPECT_EQ(editor->videoURL, QUrl::fromLocalFile(movie()));
    EXPECT_EQ(editor->fileAttachmentURL, QUrl::fromLocalFile("/home/me/notes.txt"));
    EXPECT_EQ(editor->overrideShareMessage, "Look!");
    EXPECT_EQ(editor->topToolBar->tintColor(), QColor(10, 200, 30))
        << "the colour passes through unchanged";
    EXPECT_EQ(principal->childViewControllers().size(), logs.count("loaded input items"))
        << "each handler run adds an editor; earlier ones stay beneath";
    EXPECT_EQ(editor->view()->parentWidget(), principal->view());
}

TEST_F(PrincipalTest, AFailedLoadOrATitleInTheWrongCaseBuildsNothing) {
    QList<ExtensionItem> items = required();
    items[0] = {
        TXVideoEditorExtensionBundleIdentifierKey,
        {std::make_shared<ItemProvider>(QCborMap{{"colour", "red"}},
                                        QStringList{ItemProvider::GenericDataTypeIdentifier})}};
    items.append(item(TXVideoEditorExtensionAppNameKey.toLower(), "racer"));
    items.append({TXVideoEditorExtensionBundleIdentifierKey, {}}); // no attachment at all
    request(items);
    ASSERT_TRUE(waitUntil(
        [&] { return logs.count(LogLevel::Error, "Error loading input item for type") == 1; }));
    GlobalQueue::drain();
    MainQueue::runPending();
    EXPECT_EQ(logs.count("loaded input items"), 0);
    EXPECT_FALSE(principal->videoEditorViewController);
}

TEST_F(PrincipalTest, AppearingBuildsOnceAndDisappearingTearsDown) {
    request({});
    principal->viewWillAppear(false);
    ASSERT_TRUE(principal->videoEditorViewController) << "built with whatever the inputs are: none";
    EXPECT_TRUE(principal->videoEditorViewController->videoURL.isEmpty());
    principal->viewWillAppear(false);
    EXPECT_EQ(principal->childViewControllers().size(), 1);

    principal->viewDidDisappear(false);
    EXPECT_FALSE(principal->videoEditorViewController);
    EXPECT_TRUE(principal->childViewControllers().isEmpty());
    principal->viewDidDisappear(false);
    EXPECT_EQ(logs.count("TXVideoEditorExtensionViewController -viewDidDisappear:"), 2);
}

TEST_F(PrincipalTest, TheEditorsReportGoesToTheHostUnchanged) {
    request(required());
    ASSERT_TRUE(waitUntil([&] { return bool(principal->videoEditorViewController); }));
    principal->videoEditorViewController->activityTypes = {"org.tamsel.activity.SaveToAlbum",
                                                           "TXPublishToYouTube"};
    principal->videoEditorViewController->doneAction();
    ASSERT_TRUE(waitUntil([&] { return reports.size() == 1; }));
    EXPECT_EQ(reports[0], (QCborArray{"org.tamsel.activity.SaveToAlbum", "TXPublishToYouTube"}));
    EXPECT_EQ(
        logs.count(
            "TXVideoEditorExtensionViewController -videoEditorViewDidFinishWithActivityTypes:"),
        1);
}
