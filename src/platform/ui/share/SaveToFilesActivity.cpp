#include "SaveToFilesActivity.h"

#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"
#include "platform/services/ActivityTypes.h"
#include "platform/ui/ViewController.h"
#include "platform/ui/share/ActivityItems.h"
#include "platform/ui/share/SaveLocationChooser.h"
#include "platform/ui/share/ShareStrings.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QPointer>
#include <QSaveFile>
#include <QStandardPaths>

namespace platform {

QString SaveToFilesActivity::activityType() const {
    return SaveToFilesActivityType;
}

QString SaveToFilesActivity::activityTitle() const {
    return ShareStrings::text("ACTIVITY_SAVE_TO_FILES", "Save to Files…");
}

QImage SaveToFilesActivity::activityImage() const {
    return ShareStrings::icon({QStringLiteral("document-save-as"), QStringLiteral("document-save")},
                              activityTitle(), QColor(0x00, 0x7a, 0xff), ShareStrings::Glyph::Save);
}

bool SaveToFilesActivity::canPerformWithActivityItems(const QVariantList& items) {
    return !ActivityItems::files(items).isEmpty();
}

void SaveToFilesActivity::prepareWithActivityItems(const QVariantList& items) {
    const QList<QUrl> files = ActivityItems::files(items);
    file_ = files.isEmpty() ? QUrl() : files.first();
}

QString SaveToFilesActivity::copyFile(const QString& source, const QString& destination) {
    if (QFileInfo(source).canonicalFilePath() == QFileInfo(destination).canonicalFilePath())
        return QStringLiteral("the destination is the recording itself");
    QFile in(source);
    if (!in.open(QIODevice::ReadOnly))
        return in.errorString();
    QSaveFile out(destination);
    if (!out.open(QIODevice::WriteOnly))
        return out.errorString();
    QByteArray buffer(1 << 20, Qt::Uninitialized);
    for (;;) {
        const qint64 read = in.read(buffer.data(), buffer.size());
        if (read < 0)
            return in.errorString();
        if (read == 0)
            break;
        if (out.write(buffer.constData(), read) != read)
            return out.errorString();
    }
    if (!out.commit())
        return out.errorString();
    return QString();
}

void SaveToFilesActivity::performActivity() {
    if (!file_.isValid()) {
        activityDidFinish(false);
        return;
    }
    QString folder = QStandardPaths::writableLocation(QStandardPaths::MoviesLocation);
    if (folder.isEmpty() || !QFileInfo(folder).isDir())
        folder = QDir::homePath();
    const QString source = file_.toLocalFile();
    const QString suggested = QDir(folder).filePath(QFileInfo(source).fileName());
    QWidget* parent =
        presenter() && presenter()->isViewLoaded() ? presenter()->view()->window() : nullptr;
    QPointer<SaveToFilesActivity> self = this;
    SaveLocationChooser::sharedChooser()->chooseSaveLocation(
        parent, suggested, [self, source](const QString& destination) {
            if (!self)
                return;
            if (destination.isEmpty()) {
                self->activityDidFinish(false);
                return;
            }
            // A recording may be large: the copy runs off the main thread.
            GlobalQueue::async(QueuePriority::Default, [self, source, destination] {
                const QString failure = copyFile(source, destination);
                MainQueue::async([self, destination, failure] {
                    if (!failure.isEmpty())
                        logError(QStringLiteral("SaveToFilesActivity: cannot save %1: %2")
                                     .arg(destination, failure));
                    if (self)
                        self->activityDidFinish(failure.isEmpty());
                });
            });
        });
}

} // namespace platform
