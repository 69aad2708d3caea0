#pragma once

#include "platform/services/album/PhotoAlbum.h"

namespace platform {

// The album as a folder: the user's "Screen Recordings" folder in their
// Videos (XDG videos dir), or $TAMSEL_ALBUM_DIR. A video is brought in under a
// unique name, never replacing a file that is there and never showing a
// partial one: without copying its bytes where the file system allows (a
// reflink; else, for a file of the device's own storage such as the editor's
// clips, a hard link), otherwise copied under a hidden temporary name first
// and named when whole. Files that are not playable video are refused. Both
// operations hold the file (FileHolds) from the moment they are asked, so a
// removal asked for after them waits until the import has the file open.
class FolderPhotoAlbum final : public PhotoAlbum {
  public:
    // The album in the user's Videos.
    static std::shared_ptr<FolderPhotoAlbum> inUsersVideos();
    // An album in the given host folder.
    explicit FolderPhotoAlbum(QString folderHostPath);

    const QString& folder() const { return folder_; }

    void performChanges_creationRequestForAssetFromVideoAtFileURL(const QUrl& fileURL,
                                                                  Completion completion) override;
    void saveVideoAtPathToAlbum(const QString& path) override;

    // Copies synchronously on the caller's thread; what both operations run.
    // Returns the host path of the new file, or an empty string and `error`.
    // A path that is not a regular file (a pipe, a device) is refused without
    // waiting on it. `hold` (see FileHolds), when given, is released once the
    // file is open.
    QString importVideo(const QString& devicePath, ErrorPtr* error,
                        std::shared_ptr<void> hold = nullptr);

  private:
    QString folder_;
};

} // namespace platform
