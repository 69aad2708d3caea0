#pragma once

#include "FileSystem.h"

namespace platform {

// FileSystem on std::filesystem and POSIX (statx for birth times, statvfs for
// free space), with device paths mapped through DevicePaths.
class LocalFileSystem : public FileSystem {
  public:
    bool fileExistsAtPath(const QString& path) const override;
    bool createDirectoryAtPath(const QString& path, bool withIntermediateDirectories,
                               ErrorPtr* error) override;
    QStringList contentsOfDirectoryAtPath(const QString& path, ErrorPtr* error) const override;
    std::optional<ItemAttributes> attributesOfItemAtPath(const QString& path,
                                                         ErrorPtr* error) const override;
    std::optional<FileSystemAttributes>
    attributesOfFileSystemForPath(const QString& path, ErrorPtr* error) const override;
    bool removeItemAtPath(const QString& path, ErrorPtr* error) override;
    bool moveItemAtPath(const QString& from, const QString& to, ErrorPtr* error) override;
};

} // namespace platform
