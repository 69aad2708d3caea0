// The principal view controller: the host's input items in, an editor out,
// and the editor's report back to the host.

#include "extension/TXVideoEditorExtensionKeys.h"
#include "extension/TXVideoEditorExtensionViewController.h"
#include "fakes/FakePlatform.h"
#include "platform/hosting/MessageChannel.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/MainQueue.h"
#include "support/LogCapture.h"
#include "support/TempDir.h"
#include "support/Wait.h"

#include <QCborArray>
#include <QColor>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::waitUntil;

namespace {

ExtensionItem item(const QString& title, const QVariant& value) {
    return {title, {ItemProvider::withItem(value)}};
}

const QString kMovie = QStringLiteral("/recordings/rec.mp4");

class PrincipalTest : public ::testing::Test {
  protected:
    void SetUp() override {
        fakes.world().addMovie(QUrl::fromLocalFile(kMovie), {});
        root.makeLibrary();
    }
    void TearDown() override {
        principal.reset();
        context.reset();
        GlobalQueue::drain();
        MainQueue::runPending();
    }

    // A request with these items, its host end on `host`.
    void request(const QList<ExtensionItem>& items) {
        auto [extensionEnd, hostEnd] = makeSocketPair();
        host = std::make_unique<MessageChannel>(hostEnd);
        context = std::make_shared<TXVideoEditorExtensionContext>(
            items, std::make_shared<AuxiliaryConnection>(
                       std::make_shared<MessageChannel>(extensionEnd),
                       TXVideoEditorExtensionContext::_extensionAuxiliaryVendorProtocol(),
                       TXVideoEditorExtensionContext::_extensionAuxiliaryHostProtocol()));
        principal = TXVideoEditorExtensionViewController::create();
        principal->extensionContext = context;
        context->setPrincipalObject(principal);
        principal->view(); // loads: the loads of the items start
    }
    const std::shared_ptr<TXVideoEditorViewController>& editor() const {
        return principal->videoEditorViewController;
    }

    const QList<ExtensionItem> required{
        item(TXVideoEditorExtensionBundleIdentifierKey, "org.example.Racer"),
        item(TXVideoEditorExtensionAppNameKey, "Racer"),
        item(TXVideoEditorExtensionMoviePathKey, kMovie)};
    fakes::FakePlatform fakes;
    testing_support::MobileRoot root;
    testing_support::LogCapture logs;
    std::unique_ptr<MessageChannel> host;
    std::shared_ptr<TXVideoEditorExtensionContext> context;
    std::shared_ptr<TXVideoEditorExtensionViewController> principal;
};

} // namespace

TEST_F(PrincipalTest, TheRequiredItemsBuildAnEditorWithEveryValue) {
    request(required + QList<ExtensionItem>{
                           item(TXVideoEditorExtensionFileAttachmentKey, "/home/me/notes.txt"),
                           item(TXVideoEditorExtensionOverrideShareMessageKey, "Look!"),
                           item(TXVideoEditorExtensionOverrideTintColorKey, QColor(10, 200, 30))});
    // Every load after the three required ones builds the editor again, so
    // the last editor has every value.
    ASSERT_TRUE(waitUntil([&] {
        return editor() && !editor()->fileAttachmentURL.isEmpty() &&
               !editor()->overrideShareMessage.isEmpty() &&
               editor()->topToolBar->tintColor().isValid();
    }));
    EXPECT_EQ(editor()->applicationName, "Racer");
    EXPECT_EQ(editor()->bundleIdentifier, "org.example.Racer");
    EXPECT_EQ(editor()->videoURL, QUrl::fromLocalFile(kMovie));
    EXPECT_EQ(editor()->fileAttachmentURL, QUrl::fromLocalFile("/home/me/notes.txt"));
    EXPECT_EQ(editor()->overrideShareMessage, "Look!");
    EXPECT_EQ(editor()->topToolBar->tintColor(), QColor(10, 200, 30)) << "passed through unchanged";
    EXPECT_EQ(principal->childViewControllers().size(), logs.count("loaded input items"))
        << "each handler run adds an editor; earlier ones stay beneath";
    EXPECT_EQ(editor()->view()->parentWidget(), principal->view());
}

TEST_F(PrincipalTest, AFailedLoadOrATitleInTheWrongCaseBuildsNothing) {
    QList<ExtensionItem> items = required;
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
    EXPECT_FALSE(editor());
}

TEST_F(PrincipalTest, AppearingBuildsOnceAndDisappearingTearsDown) {
    request({});
    principal->viewWillAppear(false);
    ASSERT_TRUE(editor()) << "built with whatever the inputs are: none";
    EXPECT_TRUE(editor()->videoURL.isEmpty());
    principal->viewWillAppear(false);
    EXPECT_EQ(principal->childViewControllers().size(), 1);

    principal->viewDidDisappear(false);
    EXPECT_FALSE(editor());
    EXPECT_TRUE(principal->childViewControllers().isEmpty());
    principal->viewDidDisappear(false);
    EXPECT_EQ(logs.count("TXVideoEditorExtensionViewController -viewDidDisappear:"), 2);
}
