#pragma once

#include "platform/runtime/Error.h"
#include "platform/runtime/Implementation.h"

#include <QString>
#include <QUrl>
#include <functional>
#include <memory>

namespace platform {

// The photo album: where the user's saved videos go. A video is brought in
// under a name of its own, never replacing anything there; files that are
// not playable video are refused.
//
// Callable from any thread. Work runs on the default-priority worker queue,
// and so do completions; GlobalQueue::drain() waits for writes still under
// way.
class PhotoAlbum {
  public:
    enum ErrorCode {
        NotVideo = 3302,    // the file is missing or is not playable video
        NotWritable = 3310, // the album folder cannot be made or written
        DiskFull = 3311,    // the copy did not fit
    };

    using Completion = std::function<void(bool success, ErrorPtr error)>;

    virtual ~PhotoAlbum() = default;

    // The album from implementation(): the one album of the process, in the
    // user's Videos, unless a test replaced it.
    static std::shared_ptr<PhotoAlbum> sharedAlbum();
    using Maker = std::shared_ptr<PhotoAlbum>();
    static Implementation<Maker>& implementation();

    // "Perform a change": create an album asset from the video at `fileURL`
    // (a file URL or a device path). The completion runs on a worker thread
    // with the outcome.
    virtual void
    performChanges_creationRequestForAssetFromVideoAtFileURL(const QUrl& fileURL,
                                                             Completion completion) = 0;

    // "Save a video file by path": fire and forget; a failure is logged.
    virtual void saveVideoAtPathToAlbum(const QString& path) = 0;
};

} // namespace platform
