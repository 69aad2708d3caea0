#include "EditorOnFakes.h"

#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/MainQueue.h"
#include "platform/ui/Device.h"

#include <QDirIterator>

using namespace platform;

const QUrl EditorOnFakes::recording = QUrl::fromLocalFile("/recordings/Racer 2016-03-05.mp4");

void EditorOnFakes::SetUp() {
    Device::setInterfaceIdiomOverride(Device::InterfaceIdiom::Pad);
    root.makeLibrary();
    fakes.world().addMovie(recording, fakes::FakeMovie{});
}

void EditorOnFakes::TearDown() {
    editor.reset();
    drainQueues();
    Device::setInterfaceIdiomOverride(std::nullopt);
}

void EditorOnFakes::makeEditor(const QColor& tint, const QUrl& url) {
    editor =
        TXVideoEditorViewController::initWithBundleIdentifier_URL_applicationName_overrideTintColor(
            "org.example.Racer", url.isEmpty() ? recording : url, "Racer", tint);
    editor->delegate = delegate;
    settle();
}

void EditorOnFakes::settle() {
    MainQueue::runPending();
}

void EditorOnFakes::drainQueues() {
    GlobalQueue::drain();
    MainQueue::runPending();
}

fakes::FakePlayer& EditorOnFakes::player() const {
    return dynamic_cast<fakes::FakePlayer&>(*editor->avPlayer);
}

std::string EditorOnFakes::bar(const Toolbar& toolbar) const {
    const TXVideoEditorViewController& e = *editor;
    const QList<std::pair<const char*, std::shared_ptr<ToolbarItem>>> names = {
        {"share", e.shareButton}, {"pause", e.pauseButton},
        {"save", e.saveButton},   {"|", e.flexSpace},
        {"done", e.doneButton},   {"cancel", e.cancelButton},
        {"trim", e.trimButton},   {"cancelTrim", e.cancelTrimButton},
        {"title", e.titleButton}, {"play", e.playButton},
        {"-", e.fixSpace},        {"undo", e.undoButton}};
    QStringList out;
    for (const auto& item : toolbar.items())
        for (const auto& [name, candidate] : names)
            if (candidate == item)
                out.append(name);
    return out.join(' ').toStdString();
}

QStringList EditorOnFakes::filesOnDevice() const {
    QStringList files;
    QDirIterator it(root.hostPath(), QDir::Files | QDir::Hidden | QDir::System,
                    QDirIterator::Subdirectories);
    while (it.hasNext())
        files.append(it.next());
    return files;
}
