#pragma once

#include "platform/services/LocalFileSystem.h"

#include <QSet>
#include <mutex>
#include <optional>

namespace testing_support {

// The local file system with faults and readings a test chooses: listings in
// name order, removals that fail for chosen names, attributes that cannot be
// read for chosen names, and a free-space reading of the test's choosing.
class ScriptedFileSystem final : public platform::LocalFileSystem {
  public:
    void failRemovalOf(const QString& name, int code = 13 /* EACCES */);
    void failAttributesOf(const QString& name);
    void setFreeSize(std::uint64_t bytes) { freeSize_ = bytes; }

    QStringList contentsOfDirectoryAtPath(const QString& path,
                                          platform::ErrorPtr* error) const override;
    std::optional<platform::ItemAttributes>
    attributesOfItemAtPath(const QString& path, platform::ErrorPtr* error) const override;
    std::optional<platform::FileSystemAttributes>
    attributesOfFileSystemForPath(const QString& path, platform::ErrorPtr* error) const override;
    bool removeItemAtPath(const QString& path, platform::ErrorPtr* error) override;

    // Removal attempts so far, by file name, in order.
    QStringList removals() const;

  private:
    mutable std::mutex mutex_;
    QHash<QString, int> failingRemovals_;
    QSet<QString> failingAttributes_;
    std::optional<std::uint64_t> freeSize_;
    QStringList removals_;
};

} // namespace testing_support
