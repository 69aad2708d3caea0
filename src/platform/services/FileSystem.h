#pragma once

#include "platform/runtime/Error.h"

#include <QDateTime>
#include <QString>
#include <QStringList>
#include <cstdint>
#include <memory>
#include <optional>

namespace platform {

struct ItemAttributes {
    std::uint64_t size = 0;
    QDateTime modificationDate; // invalid when unknown
    QDateTime creationDate; // birth time; the modification time where the file system keeps none
    bool isDirectory = false;
};

struct FileSystemAttributes {
    std::uint64_t size = 0;     // bytes
    std::uint64_t freeSize = 0; // bytes available to this user
};

// The file-system primitives the system's file manager acts through. Paths are
// device paths (see DevicePaths); errors name them. Every operation is
// synchronous, runs on the caller's thread, may be called from any thread and
// reports failure through the optional error out-parameter, never by throwing.
class FileSystem {
  public:
    virtual ~FileSystem() = default;

    // True when anything (file, directory, other) is at `path`; symbolic links
    // are not followed.
    virtual bool fileExistsAtPath(const QString& path) const = 0;

    virtual bool createDirectoryAtPath(const QString& path, bool withIntermediateDirectories,
                                       ErrorPtr* error) = 0;

    // Names of the direct entries of a directory, without "." and "..", in
    // the order the file system lists them.
    virtual QStringList contentsOfDirectoryAtPath(const QString& path, ErrorPtr* error) const = 0;

    virtual std::optional<ItemAttributes> attributesOfItemAtPath(const QString& path,
                                                                 ErrorPtr* error) const = 0;

    virtual std::optional<FileSystemAttributes>
    attributesOfFileSystemForPath(const QString& path, ErrorPtr* error) const = 0;

    // Removes a file, or a directory with everything in it, once the reads
    // of it already asked for have it open (FileHolds).
    virtual bool removeItemAtPath(const QString& path, ErrorPtr* error) = 0;

    // Moves (renames) `from` to `to`; fails when `to` exists. Crosses file
    // systems by copying and then removing the source.
    virtual bool moveItemAtPath(const QString& from, const QString& to, ErrorPtr* error) = 0;

    // The local file system of this machine, through the device-path mapping.
    static std::shared_ptr<FileSystem> local();
};

} // namespace platform
