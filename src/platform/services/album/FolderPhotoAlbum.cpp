#include "FolderPhotoAlbum.h"

#include "platform/media/Asset.h"
#include "platform/runtime/DevicePaths.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/Log.h"
#include "platform/services/FileHolds.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QStandardPaths>
#include <cerrno>
#include <csignal>
#include <cstring>
#include <fcntl.h>
#include <linux/fs.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace platform {
namespace {

const QString kDomain = QStringLiteral("PhotoAlbum");

ErrorPtr albumError(PhotoAlbum::ErrorCode code, const QString& message) {
    return makeError(code, kDomain, message);
}

ErrorPtr errorForErrno(int err, const QString& what) {
    if (err == ENOSPC || err == EFBIG || err == EDQUOT)
        return albumError(PhotoAlbum::DiskFull,
                          QStringLiteral("not enough space for %1").arg(what));
    return albumError(PhotoAlbum::NotWritable,
                      QStringLiteral("%1: %2").arg(what, QString::fromLocal8Bit(strerror(err))));
}

// Closes a descriptor when it goes out of scope.
struct Descriptor {
    int fd = -1;
    ~Descriptor() {
        if (fd >= 0)
            ::close(fd);
    }
};

// Copies everything from `in` to `out`, in the kernel where it can.
int copyContents(int in, int out) {
    for (;;) {
        const ssize_t n = ::copy_file_range(in, nullptr, out, nullptr, 1 << 30, 0);
        if (n == 0)
            return 0;
        if (n > 0)
            continue;
        if (errno == EINTR)
            continue;
        if (errno != EXDEV && errno != ENOSYS && errno != EOPNOTSUPP && errno != EINVAL)
            return errno;
        break; // this pair of file systems needs a plain copy
    }
    char buffer[1 << 16];
    for (;;) {
        const ssize_t n = ::read(in, buffer, sizeof buffer);
        if (n == 0)
            return 0;
        if (n < 0) {
            if (errno == EINTR)
                continue;
            return errno;
        }
        for (ssize_t done = 0; done < n;) {
            const ssize_t w = ::write(out, buffer + done, size_t(n - done));
            if (w < 0) {
                if (errno == EINTR)
                    continue;
                return errno;
            }
            done += w;
        }
    }
}

// Files of the device's own storage (the editor's clips) are never written
// again once made, so the album may share them; a host's file may change
// under its owner, so the album gets its own copy of that.
bool mayShare(const QString& hostPath) {
    return DevicePaths::toDevice(hostPath).startsWith(QLatin1String("/private/var/mobile/"));
}

// "clip.mp4", "clip 2.mp4", "clip 3.mp4" ... A name that starts with a dot
// would hide the video from the user's file manager, so the dots go.
QString candidateName(const QFileInfo& source, int attempt) {
    QString name = source.fileName();
    qsizetype dots = 0;
    while (dots < name.size() && name.at(dots) == QLatin1Char('.'))
        ++dots;
    if (dots > 0) {
        name = name.mid(dots);
        // ".mp4" keeps its extension: "Video.mp4".
        if (!name.contains(QLatin1Char('.')))
            name = QStringLiteral("Video") + (name.isEmpty() ? QString() : QLatin1Char('.') + name);
    }
    if (attempt == 1)
        return name;
    const QFileInfo named(name);
    const QString suffix = named.suffix().isEmpty() ? QString() : QLatin1Char('.') + named.suffix();
    return QStringLiteral("%1 %2%3").arg(named.completeBaseName()).arg(attempt).arg(suffix);
}

} // namespace

Implementation<PhotoAlbum::Maker>& PhotoAlbum::implementation() {
    static Implementation<Maker> chosen([]() -> std::shared_ptr<PhotoAlbum> {
        // One album for the process: made on first use, where the user's
        // Videos are then.
        static const std::shared_ptr<PhotoAlbum> shared = FolderPhotoAlbum::inUsersVideos();
        return shared;
    });
    return chosen;
}

std::shared_ptr<PhotoAlbum> PhotoAlbum::sharedAlbum() {
    return implementation().make();
}

std::shared_ptr<FolderPhotoAlbum> FolderPhotoAlbum::inUsersVideos() {
    QString folder = qEnvironmentVariable("TAMSEL_ALBUM_DIR");
    if (folder.isEmpty()) {
        QString videos = QStandardPaths::writableLocation(QStandardPaths::MoviesLocation);
        if (videos.isEmpty())
            videos = QDir::homePath() + QStringLiteral("/Videos");
        folder = videos + QStringLiteral("/Screen Recordings");
    }
    return std::make_shared<FolderPhotoAlbum>(folder);
}

FolderPhotoAlbum::FolderPhotoAlbum(QString folderHostPath) : folder_(std::move(folderHostPath)) {}

QString FolderPhotoAlbum::importVideo(const QString& devicePath, ErrorPtr* error,
                                      std::shared_ptr<void> hold) {
    const QString source = DevicePaths::toHost(devicePath);
    // Opened first, without waiting on a pipe or a device: from here on a
    // removal of the name cannot take the bytes away, and the hold goes.
    Descriptor in;
    in.fd = ::open(source.toLocal8Bit().constData(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    hold.reset();
    struct stat st;
    if (in.fd < 0 || ::fstat(in.fd, &st) != 0 || !S_ISREG(st.st_mode)) {
        setError(error, albumError(NotVideo, QStringLiteral("%1 cannot be read").arg(devicePath)));
        return {};
    }
    const auto asset =
        Asset::assetWithURL(QUrl::fromLocalFile(QStringLiteral("/proc/self/fd/%1").arg(in.fd)));
    if (asset->tracksWithMediaType(MediaType::Video).isEmpty() || !asset->isPlayable()) {
        setError(error, albumError(NotVideo,
                                   QStringLiteral("%1 is not a playable video").arg(devicePath)));
        return {};
    }
    if (!QDir().mkpath(folder_) || !QFileInfo(folder_).isDir()) {
        setError(error, errorForErrno(ENOTDIR, folder_));
        return {};
    }
    const QByteArray folder = folder_.toLocal8Bit();
    Descriptor dir;
    dir.fd = ::open(folder.constData(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    const QFileInfo sourceInfo(source);
    auto named = [&](const QString& name) { return folder_ + QLatin1Char('/') + name; };
    // The copy is written as an unnamed file in the album folder and given a
    // name only when whole, so the album never shows a partial file.
    Descriptor out;
    out.fd = dir.fd < 0 ? -1 : ::openat(dir.fd, ".", O_TMPFILE | O_WRONLY | O_CLOEXEC, 0644);
    // Some file systems have no unnamed files; a hidden name stands in, and
    // goes whatever happens.
    QByteArray hiddenName;
    if (out.fd < 0 && dir.fd >= 0 && (errno == EOPNOTSUPP || errno == EISDIR || errno == EINVAL)) {
        QByteArray pattern = folder + "/.tamsel-import-XXXXXX";
        out.fd = ::mkostemp(pattern.data(), O_CLOEXEC);
        if (out.fd >= 0)
            hiddenName = pattern;
    }
    if (out.fd < 0) {
        setError(error, errorForErrno(errno, folder_));
        return {};
    }
    struct Cleanup {
        QByteArray path;
        ~Cleanup() {
            if (!path.isEmpty())
                ::unlink(path.constData());
        }
    } cleanup{hiddenName};
    // The clip's bytes are not copied where the file system can share them:
    // a reflink (blocks shared until either side writes), else, for the
    // device's own files, a hard link to the whole file (which, like the
    // rename of a finished copy, never shows a partial one).
    const bool cloned = ::ioctl(out.fd, FICLONE, in.fd) == 0;
    if (!cloned && mayShare(source)) {
        const QByteArray from = QFile::encodeName(source);
        for (int attempt = 1; attempt < 10000; ++attempt) {
            const QString name = candidateName(sourceInfo, attempt);
            if (::linkat(AT_FDCWD, from.constData(), dir.fd, QFile::encodeName(name).constData(),
                         0) == 0)
                return named(name);
            if (errno != EEXIST)
                break; // another file system, or links not allowed: copy
        }
    }
    // A size limit on this process would kill it on the first byte too many.
    std::signal(SIGXFSZ, SIG_IGN);
    if (const int err = cloned ? 0 : copyContents(in.fd, out.fd);
        err != 0 || ::fsync(out.fd) != 0) {
        setError(error, errorForErrno(err ? err : errno, devicePath));
        return {};
    }

    const QByteArray procPath =
        hiddenName.isEmpty() ? QByteArrayLiteral("/proc/self/fd/") + QByteArray::number(out.fd)
                             : hiddenName;
    for (int attempt = 1; attempt < 10000; ++attempt) {
        const QString name = candidateName(sourceInfo, attempt);
        // linkat never replaces: a name that is taken fails with EEXIST.
        if (::linkat(AT_FDCWD, procPath.constData(), dir.fd, name.toLocal8Bit().constData(),
                     AT_SYMLINK_FOLLOW) == 0)
            return named(name);
        if (errno != EEXIST) {
            setError(error, errorForErrno(errno, folder_));
            return {};
        }
    }
    setError(error, errorForErrno(EEXIST, folder_));
    return {};
}

void FolderPhotoAlbum::performChanges_creationRequestForAssetFromVideoAtFileURL(
    const QUrl& fileURL, Completion completion) {
    const QString path = fileURL.isLocalFile() ? fileURL.toLocalFile() : fileURL.toString();
    GlobalQueue::async(QueuePriority::Default, [album = *this, path,
                                                hold = FileHolds::hold(DevicePaths::toHost(path)),
                                                completion = std::move(completion)]() mutable {
        ErrorPtr error;
        const bool saved = !album.importVideo(path, &error, std::move(hold)).isEmpty();
        if (completion)
            completion(saved, error);
    });
}

void FolderPhotoAlbum::saveVideoAtPathToAlbum(const QString& path) {
    GlobalQueue::async(
        QueuePriority::Default,
        [album = *this, path, hold = FileHolds::hold(DevicePaths::toHost(path))]() mutable {
            ErrorPtr error;
            if (album.importVideo(path, &error, std::move(hold)).isEmpty())
                logError(QStringLiteral("photo album: %1").arg(error->description()));
        });
}

} // namespace platform
