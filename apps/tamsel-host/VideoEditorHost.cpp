#include <tamsel/VideoEditorHost.h>

#include "extension/TXVideoEditorExtensionKeys.h"
#include "platform/hosting/host/ExtensionLauncher.h"

#include <QDir>
#include <QFileInfo>
#include <QStandardPaths>
#include <dlfcn.h>

namespace tamsel {

using platform::ExtensionItem;
using platform::ItemProvider;

namespace {

// Where this library was loaded from; the program's directory when it is
// linked in statically.
QString libraryDirectory() {
    Dl_info info{};
    if (dladdr(reinterpret_cast<void*>(&VideoEditorHost::defaultEditorProgram), &info) &&
        info.dli_fname)
        return QFileInfo(QString::fromLocal8Bit(info.dli_fname)).absolutePath();
    return {};
}

// The input items a host sends, in the order it sends them.
QList<ExtensionItem> inputItems(const VideoEditorRequest& request) {
    QList<ExtensionItem> items{
        {TXVideoEditorExtensionMoviePathKey,
         {ItemProvider::withItem(QFileInfo(request.moviePath).absoluteFilePath())}},
        {TXVideoEditorExtensionAppNameKey, {ItemProvider::withItem(request.appName)}},
        {TXVideoEditorExtensionBundleIdentifierKey,
         {ItemProvider::withItem(request.bundleIdentifier)}},
    };
    if (!request.attachmentPath.isEmpty())
        items.append(
            {TXVideoEditorExtensionFileAttachmentKey,
             {ItemProvider::withItem(QFileInfo(request.attachmentPath).absoluteFilePath())}});
    if (!request.shareMessage.isNull())
        items.append({TXVideoEditorExtensionOverrideShareMessageKey,
                      {ItemProvider::withItem(request.shareMessage)}});
    if (request.tintColor.isValid())
        items.append({TXVideoEditorExtensionOverrideTintColorKey,
                      {ItemProvider::withItem(request.tintColor)}});
    return items;
}

} // namespace

struct VideoEditorHost::Private {
    platform::ExtensionLauncher launcher;
    QString program = VideoEditorHost::defaultEditorProgram();
    bool open = false;
    bool reported = false;
};

VideoEditorHost::VideoEditorHost(QObject* parent) : QObject(parent), d(new Private) {
    connect(&d->launcher, &platform::ExtensionLauncher::extensionDidFinishWithActivityTypes, this,
            [this](const QStringList& activityTypes) {
                if (d->reported)
                    return;
                d->reported = true;
                emit finished(activityTypes);
                // The user is done: the host takes the list and closes the editor.
                d->launcher.dismiss();
            });
    connect(&d->launcher, &platform::ExtensionLauncher::extensionEnded, this,
            [this](int exitCode, bool crashed) {
                d->open = false;
                if (crashed) {
                    const bool signalled =
                        d->launcher.process().exitStatus() == QProcess::CrashExit;
                    emit ended(true, QStringLiteral("%1 %2")
                                         .arg(signalled ? QStringLiteral("crash,")
                                                        : QStringLiteral("exit status"))
                                         .arg(exitCode));
                    return;
                }
                // The window was closed: dismissed with nothing done.
                if (!d->reported)
                    emit finished({});
                emit ended(false, QString());
            });
}

VideoEditorHost::~VideoEditorHost() = default;

QString VideoEditorHost::defaultEditorProgram() {
    const QString name = QStringLiteral("tamsel-video-editor");
    if (const QString set = qEnvironmentVariable("TAMSEL_VIDEO_EDITOR"); !set.isEmpty())
        return set;
    if (const QString dir = libraryDirectory(); !dir.isEmpty()) {
        // Installed, the programs are where the prefix keeps them; in the
        // build tree, beside the libraries' directory.
        for (const QString& relative : {QStringLiteral(TAMSEL_HOST_BINDIR_FROM_LIBDIR),
                                        QStringLiteral("../bin"), QStringLiteral(".")}) {
            const QFileInfo candidate(QDir::cleanPath(dir + '/' + relative + '/' + name));
            if (candidate.isFile() && candidate.isExecutable())
                return candidate.filePath();
        }
    }
    const QString onPath = QStandardPaths::findExecutable(name);
    return onPath.isEmpty() ? name : onPath;
}

QString VideoEditorHost::editorProgram() const {
    return d->program;
}

void VideoEditorHost::setEditorProgram(const QString& program) {
    d->program = program;
}

bool VideoEditorHost::open(const VideoEditorRequest& request, QString* error) {
    auto fail = [error](const QString& why) {
        if (error)
            *error = why;
        return false;
    };
    if (d->open)
        return fail(QStringLiteral("the editor is already open"));
    if (request.moviePath.isEmpty() || request.appName.isEmpty() ||
        request.bundleIdentifier.isEmpty())
        return fail(QStringLiteral("a request needs a movie, an application name and a bundle "
                                   "identifier"));
    QString why;
    if (!d->launcher.start(d->program, request.editorArguments, inputItems(request), &why))
        return fail(why);
    d->open = true;
    d->reported = false;
    return true;
}

void VideoEditorHost::close() {
    if (d->open)
        d->launcher.dismiss();
}

bool VideoEditorHost::isOpen() const {
    return d->open;
}

} // namespace tamsel
