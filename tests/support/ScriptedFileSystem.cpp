#include "ScriptedFileSystem.h"

#include <QFileInfo>

namespace testing_support {
namespace {
QString nameOf(const QString& path) {
    return QFileInfo(path).fileName();
}
} // namespace

void ScriptedFileSystem::failRemovalOf(const QString& name, int code) {
    std::lock_guard lock(mutex_);
    failingRemovals_.insert(name, code);
}

void ScriptedFileSystem::failAttributesOf(const QString& name) {
    std::lock_guard lock(mutex_);
    failingAttributes_.insert(name);
}

QStringList ScriptedFileSystem::contentsOfDirectoryAtPath(const QString& path,
                                                          platform::ErrorPtr* error) const {
    QStringList names = LocalFileSystem::contentsOfDirectoryAtPath(path, error);
    names.sort();
    return names;
}

std::optional<platform::ItemAttributes>
ScriptedFileSystem::attributesOfItemAtPath(const QString& path, platform::ErrorPtr* error) const {
    {
        std::lock_guard lock(mutex_);
        if (failingAttributes_.contains(nameOf(path))) {
            platform::setError(error, platform::posixError(5 /* EIO */, path));
            return std::nullopt;
        }
    }
    return LocalFileSystem::attributesOfItemAtPath(path, error);
}

std::optional<platform::FileSystemAttributes>
ScriptedFileSystem::attributesOfFileSystemForPath(const QString& path,
                                                  platform::ErrorPtr* error) const {
    auto attributes = LocalFileSystem::attributesOfFileSystemForPath(path, error);
    if (attributes && freeSize_)
        attributes->freeSize = *freeSize_;
    return attributes;
}

bool ScriptedFileSystem::removeItemAtPath(const QString& path, platform::ErrorPtr* error) {
    int code = 0;
    {
        std::lock_guard lock(mutex_);
        removals_.append(nameOf(path));
        code = failingRemovals_.value(nameOf(path));
    }
    if (code) {
        platform::setError(error, platform::posixError(code, path));
        return false;
    }
    return LocalFileSystem::removeItemAtPath(path, error);
}

QStringList ScriptedFileSystem::removals() const {
    std::lock_guard lock(mutex_);
    return removals_;
}

} // namespace testing_support
