#include "EditorFixture.h"

#include "MediaGenerator.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/MainQueue.h"
#include "platform/ui/Device.h"
#include "support/Wait.h"

#include <QCoreApplication>

QTemporaryDir* EditorTest::media = nullptr;

QString EditorTest::landscape() {
    return media->filePath("landscape.mp4");
}

QString EditorTest::portrait() {
    return media->filePath("portrait.mp4");
}

void EditorTest::SetUpTestSuite() {
    qputenv("TAMSEL_AUDIO", "null");
    media = new QTemporaryDir;
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 10;
    QString error;
    ASSERT_TRUE(testmedia::writeMovie(landscape(), movieSpec, &error)) << error.toStdString();
    movieSpec.seconds = 2;
    movieSpec.rotationDegrees = 90;
    ASSERT_TRUE(testmedia::writeMovie(portrait(), movieSpec, &error)) << error.toStdString();
}

void EditorTest::TearDownTestSuite() {
    delete media;
    media = nullptr;
}

void EditorTest::SetUp() {
    // The layout follows the device; a tablet has one, whatever the screen.
    platform::Device::setInterfaceIdiomOverride(platform::Device::InterfaceIdiom::Pad);
}

void EditorTest::TearDown() {
    platform::Device::setInterfaceIdiomOverride(std::nullopt);
    editor.reset();
    platform::GlobalQueue::drain();
    platform::MainQueue::runPending();
}

bool EditorTest::makeEditor(const QString& movie, const QColor& tint) {
    root.makeLibrary();
    editor =
        TXVideoEditorViewController::initWithBundleIdentifier_URL_applicationName_overrideTintColor(
            "org.example.Racer", QUrl::fromLocalFile(movie.isEmpty() ? landscape() : movie),
            "Racer", tint);
    editor->delegate = delegate;
    return testing_support::waitUntil([this] {
        const auto& item = editor->avPlayer->currentItem();
        return item && item->status() == platform::PlayerItem::Status::ReadyToPlay &&
               editor->editEndTime > 0;
    });
}
