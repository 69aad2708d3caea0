// The editor with the real services: a real player, export and album on a
// generated recording, with the widgets on the offscreen platform. Its logic
// is tested on fakes in tests/unit/editor; here the real services meet it.

#include "MediaGenerator.h"
#include "editor/TXVideoEditorViewController.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/MainQueue.h"
#include "platform/ui/Device.h"
#include "support/TempDir.h"
#include "support/Wait.h"

#include <QDir>
#include <QTemporaryDir>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::waitUntil;

namespace {

struct RecordingEditorDelegate : TXVideoEditorViewControllerDelegate {
    QList<QStringList> reports;
    void videoEditor_didFinishWithActivityTypes(TXVideoEditorViewController*,
                                                const QStringList& types) override {
        reports.append(types);
    }
};

} // namespace

TEST(EditorTest, ATrimmedSaveExportsFromTheStartForTheEndHandlesLength) {
    qputenv("TAMSEL_AUDIO", "null");
    QTemporaryDir media, album;
    testing_support::MobileRoot root;
    root.makeLibrary();
    testing_support::ScopedEnv albumEnv{"TAMSEL_ALBUM_DIR", album.path().toLocal8Bit()};
    const QString recording = media.filePath("landscape.mp4");
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 10;
    QString error;
    ASSERT_TRUE(testmedia::writeMovie(recording, movieSpec, &error)) << error.toStdString();
    Device::setInterfaceIdiomOverride(Device::InterfaceIdiom::Pad);

    auto delegate = std::make_shared<RecordingEditorDelegate>();
    auto editor = TXVideoEditorViewController::initWithBundleIdentifier_URL_applicationName(
        "org.example.Racer", QUrl::fromLocalFile(recording), "Racer");
    editor->delegate = delegate;
    ASSERT_TRUE(waitUntil([&] { return editor->editEndTime > 0; }));
    EXPECT_NEAR(editor->editEndTime, 10.0, 0.1);

    editor->movieScrubberDidBeginEditing(editor->avTrimmer.get());
    editor->editStartTime = 2.0;
    editor->editEndTime = 5.0;
    editor->saveAction();
    ASSERT_TRUE(waitUntil([&] { return !editor->isExporting(); }, 30000));
    EXPECT_TRUE(delegate->reports.isEmpty()) << "a trimmed save keeps the editor open";
    EXPECT_EQ(editor->videoURL, editor->trimFilePath);
    ASSERT_TRUE(waitUntil([&] {
        return editor->avPlayer->currentItem()->status() == PlayerItem::Status::ReadyToPlay;
    }));
    // From 2 s for 5 s: to 7 s.
    EXPECT_NEAR(editor->avPlayer->currentItem()->asset()->duration().seconds(), 5.0, 0.1);
    EXPECT_NEAR(editor->editEndTime, 5.0, 0.1);
    GlobalQueue::drain();
    EXPECT_EQ(QDir(album.path()).entryList(QDir::Files).size(), 1);

    editor.reset();
    GlobalQueue::drain();
    MainQueue::runPending();
    Device::setInterfaceIdiomOverride(std::nullopt);
}
