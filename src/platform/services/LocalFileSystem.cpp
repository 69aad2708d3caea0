#include "LocalFileSystem.h"

#include "FileHolds.h"
#include "platform/runtime/DevicePaths.h"

#include <cerrno>
#include <dirent.h>
#include <fcntl.h>
#include <filesystem>
#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

namespace fs = std::filesystem;

namespace platform {
namespace {

// A trailing slash would make the kernel insist on a directory; the file
// manager asks about whatever is at the path, so it goes.
QByteArray hostBytes(const QString& devicePath) {
    QString host = DevicePaths::toHost(devicePath);
    while (host.size() > 1 && host.endsWith(QLatin1Char('/')))
        host.chop(1);
    return host.toLocal8Bit();
}

QDateTime fromTimestamp(const statx_timestamp& ts) {
    return QDateTime::fromMSecsSinceEpoch(ts.tv_sec * 1000 + ts.tv_nsec / 1000000);
}

} // namespace

std::shared_ptr<FileSystem> FileSystem::local() {
    static auto instance = std::make_shared<LocalFileSystem>();
    return instance;
}

bool LocalFileSystem::fileExistsAtPath(const QString& path) const {
    struct stat st;
    return ::lstat(hostBytes(path).constData(), &st) == 0;
}

bool LocalFileSystem::createDirectoryAtPath(const QString& path, bool withIntermediateDirectories,
                                            ErrorPtr* error) {
    const QByteArray host = hostBytes(path);
    if (withIntermediateDirectories) {
        std::error_code ec;
        fs::create_directories(fs::path(host.toStdString()), ec);
        if (ec) {
            setError(error, posixError(ec, path));
            return false;
        }
        return true;
    }
    if (::mkdir(host.constData(), 0777) != 0) {
        setError(error, posixError(errno, path));
        return false;
    }
    return true;
}

QStringList LocalFileSystem::contentsOfDirectoryAtPath(const QString& path, ErrorPtr* error) const {
    QStringList names;
    DIR* dir = ::opendir(hostBytes(path).constData());
    if (!dir) {
        setError(error, posixError(errno, path));
        return names;
    }
    while (const dirent* entry = ::readdir(dir)) {
        const QString name = QString::fromLocal8Bit(entry->d_name);
        if (name != QLatin1String(".") && name != QLatin1String(".."))
            names.append(name);
    }
    ::closedir(dir);
    return names;
}

std::optional<ItemAttributes> LocalFileSystem::attributesOfItemAtPath(const QString& path,
                                                                      ErrorPtr* error) const {
    struct statx stx;
    const unsigned mask = STATX_TYPE | STATX_SIZE | STATX_MTIME | STATX_BTIME;
    if (::statx(AT_FDCWD, hostBytes(path).constData(), AT_SYMLINK_NOFOLLOW, mask, &stx) != 0) {
        setError(error, posixError(errno, path));
        return std::nullopt;
    }
    ItemAttributes attributes;
    attributes.size = stx.stx_size;
    attributes.isDirectory = S_ISDIR(stx.stx_mode);
    attributes.modificationDate = fromTimestamp(stx.stx_mtime);
    attributes.creationDate =
        (stx.stx_mask & STATX_BTIME) ? fromTimestamp(stx.stx_btime) : attributes.modificationDate;
    return attributes;
}

std::optional<FileSystemAttributes>
LocalFileSystem::attributesOfFileSystemForPath(const QString& path, ErrorPtr* error) const {
    struct statvfs st;
    if (::statvfs(hostBytes(path).constData(), &st) != 0) {
        setError(error, posixError(errno, path));
        return std::nullopt;
    }
    FileSystemAttributes attributes;
    attributes.size = std::uint64_t(st.f_blocks) * st.f_frsize;
    attributes.freeSize = std::uint64_t(st.f_bavail) * st.f_frsize;
    return attributes;
}

bool LocalFileSystem::removeItemAtPath(const QString& path, ErrorPtr* error) {
    std::error_code ec;
    const QByteArray hostPath = hostBytes(path);
    // A read of the file asked for earlier (the album importing it) goes
    // first; removals run on worker threads, so waiting here blocks no one
    // the reader needs.
    FileHolds::waitForRelease(QString::fromLocal8Bit(hostPath));
    const fs::path host(hostPath.toStdString());
    if (!fs::exists(fs::symlink_status(host, ec))) {
        setError(error, posixError(ENOENT, path));
        return false;
    }
    fs::remove_all(host, ec);
    if (ec) {
        setError(error, posixError(ec, path));
        return false;
    }
    return true;
}

bool LocalFileSystem::moveItemAtPath(const QString& from, const QString& to, ErrorPtr* error) {
    const QByteArray hostFrom = hostBytes(from);
    const QByteArray hostTo = hostBytes(to);
    if (fileExistsAtPath(to)) {
        setError(error, posixError(EEXIST, to));
        return false;
    }
    if (::rename(hostFrom.constData(), hostTo.constData()) == 0)
        return true;
    if (errno != EXDEV) {
        setError(error, posixError(errno, from));
        return false;
    }
    std::error_code ec;
    fs::copy(fs::path(hostFrom.toStdString()), fs::path(hostTo.toStdString()),
             fs::copy_options::recursive | fs::copy_options::copy_symlinks, ec);
    if (!ec)
        fs::remove_all(fs::path(hostFrom.toStdString()), ec);
    if (ec) {
        setError(error, posixError(ec, from));
        return false;
    }
    return true;
}

} // namespace platform
