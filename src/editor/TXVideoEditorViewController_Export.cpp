// The editor's finishing: the trimmed clip's name, saving to the album, done.

#include "TXVideoEditorViewController.h"

#include "platform/media/playback/NotificationCenter.h"
#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"
#include "platform/services/ActivityTypes.h"
#include "platform/services/album/PhotoAlbum.h"
#include "support/FileManager.h"

#include <QDateTime>

using namespace platform;

QUrl TXVideoEditorViewController::trimFileURL() {
    const QString prefix =
        QStringLiteral("%1/%2_").arg(FileManager::defaultManager()->_srTempPath(), applicationName);
    const long seconds = long(QDateTime::currentMSecsSinceEpoch() / 1000);
    return QUrl::fromLocalFile(
        QStringLiteral("%1%2%3").arg(prefix, QString::number(seconds), QStringLiteral(".mp4")));
}

void TXVideoEditorViewController::saveAction() {
    activityTypes.append(SaveToAlbumActivityType);
    if (isTrimming()) {
        exportTrimVideoSaveToCameraRoll();
        return;
    }
    // The delegate hears of the save before it is even attempted.
    doneAction();
    PhotoAlbum::sharedAlbum()->performChanges_creationRequestForAssetFromVideoAtFileURL(
        videoURL, [editor = self()](bool success, ErrorPtr error) mutable {
            if (error)
                logError(
                    QStringLiteral("Error writing video to camera roll: %1").arg(error->code()));
            MainQueue::async([editor = std::move(editor)] {});
        });
}

void TXVideoEditorViewController::exportTrimVideoSaveToCameraRoll() {
    // The previous clip goes first. A new export in the same second reuses
    // its name, so the export starts only once the removal has run; started
    // earlier, a late removal would delete the new clip.
    FileManager::defaultManager()->_srRemoveFile_completion(
        trimFilePath, [editor = self()](ErrorPtr) mutable {
            MainQueue::async([editor = std::move(editor)] { editor->startTrimExport(); });
        });
    setExporting(true);
    exportSession =
        ExportSession::exportSessionWithAsset_presetName(avAsset, ExportPresetPassthrough);
    trimFilePath = trimFileURL();
    exportSession->setOutputURL(trimFilePath);
    exportSession->setOutputFileType(FileTypeMPEG4);

    // The end handle's position is the range's duration, not its end: from a
    // start s the clip runs to editEndTime + s, clipped at the movie's end.
    const std::int32_t timescale = avPlayer ? avPlayer->currentTime().timescale : 0;
    const MediaTime start = MediaTime::fromSeconds(editStartTime, timescale);
    const MediaTime duration = MediaTime::fromSeconds(editEndTime, timescale);
    exportSession->setTimeRange(MediaTimeRange::make(start, duration));
}

void TXVideoEditorViewController::startTrimExport() {
    exportSession->exportAsynchronouslyWithCompletionHandler([editor = self(),
                                                              session = exportSession]() mutable {
        const int status = session->status();
        if (status == int(ExportSessionStatus::Failed)) {
            const ErrorPtr error = session->error();
            logError(QStringLiteral(
                         "TQVideoEditorViewController: Export Trim Video Failed, due to error: %1")
                         .arg(error ? error->code() : 0));
        } else if (status == int(ExportSessionStatus::Cancelled)) {
            logDefault(QStringLiteral("TQVideoEditorViewController: Export Trim Video Cancelled"));
        } else {
            MainQueue::sync([&editor, &session] {
                PhotoAlbum::sharedAlbum()->saveVideoAtPathToAlbum(
                    session->outputURL().toLocalFile());
                editor->setExporting(false);
                NotificationCenter::defaultCenter().removeObserver(editor.get());
                editor->reloadAVLayerWithURL(session->outputURL());
                editor->observeEndOfPlay();
            });
        }
        // The editor is a view controller: its last reference goes on the
        // main thread.
        MainQueue::async([editor = std::move(editor)] {});
    });
}

void TXVideoEditorViewController::doneAction() {
    avPlayer->pause();
    if (auto receiver = delegate.lock())
        receiver->videoEditor_didFinishWithActivityTypes(this, activityTypes);
}
