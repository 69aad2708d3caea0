#pragma once

#include "platform/runtime/Error.h"

#include <QString>
#include <QUrl>
#include <functional>
#include <memory>

namespace platform {

// The photo album: the user's "Screen Recordings" folder in their Videos
// (XDG videos dir), or $TAMSEL_ALBUM_DIR. A video is brought in under a unique
// name, never replacing a file that is there and never showing a partial one:
// without copying its bytes where the file system allows (a reflink; else,
// for a file of the device's own storage such as the editor's clips, a hard
// link), otherwise copied under a hidden temporary name first and named when
// whole. Files that are not playable video are refused.
//
// Callable from any thread. Work runs on the default-priority worker queue;
// GlobalQueue::drain() waits for writes still under way.
class PhotoAlbum {
  public:
    enum ErrorCode {
        NotVideo = 3302,    // the file is missing or is not playable video
        NotWritable = 3310, // the album folder cannot be made or written
        DiskFull = 3311,    // the copy did not fit
    };

    using Completion = std::function<void(bool success, ErrorPtr error)>;

    // The album in the user's Videos.
    static std::shared_ptr<PhotoAlbum> sharedAlbum();
    // An album in the given host folder.
    explicit PhotoAlbum(QString folderHostPath);

    const QString& folder() const { return folder_; }

    // "Perform a change": create an album asset from the video at `fileURL`.
    // The completion runs on a worker thread with the outcome; on success the
    // new file's host path is available through lastSavedPath().
    void performChanges_creationRequestForAssetFromVideoAtFileURL(const QUrl& fileURL,
                                                                  Completion completion);

    // "Save a video file by path": fire and forget.
    void saveVideoAtPathToAlbum(const QString& path);

    // Copies synchronously on the caller's thread; what both operations run.
    // Returns the host path of the new file, or an empty string and `error`.
    QString importVideo(const QString& devicePath, ErrorPtr* error);

    QString lastSavedPath() const;

  private:
    QString folder_;
    mutable std::shared_ptr<QString> lastSaved_ = std::make_shared<QString>();
};

} // namespace platform
