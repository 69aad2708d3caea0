#include "FileManager.h"

#include "PrefixMatch.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/Log.h"

#include <cmath>
#include <limits>

using platform::ErrorPtr;
using platform::QueuePriority;
using platform::GlobalQueue::async;

const QString TXScreenRecorderTempDirectory = QStringLiteral("/private/var/mobile/Library/Tamsel/");
const std::uint64_t TXScreenRecorderRequiredFreeSpace = 100000000;

namespace {

QString pathOfUrl(const QUrl& url) {
    return url.isLocalFile() ? url.toLocalFile() : url.path();
}

// How "%i" prints a double: truncated toward zero, clamped to 32 bits, NaN as 0.
int loggedSeconds(double seconds) {
    if (std::isnan(seconds))
        return 0;
    if (seconds >= double(std::numeric_limits<int>::max()))
        return std::numeric_limits<int>::max();
    if (seconds <= double(std::numeric_limits<int>::min()))
        return std::numeric_limits<int>::min();
    return int(seconds);
}

void reportPurgeError(const ErrorPtr& error) {
    if (!error)
        return;
    platform::logError(
        QStringLiteral(
            "error in _tqRemoveFile_srDeleteFilesOlderThanTimeToLiveInSeconds, error code: %1")
            .arg(error->code()));
    platform::logConsole(QStringLiteral("error = %1").arg(error->description()));
}

} // namespace

FileManager::FileManager(std::shared_ptr<platform::FileSystem> fileSystem, Clock clock)
    : fileSystem_(std::move(fileSystem)),
      clock_(clock ? std::move(clock) : Clock([] { return QDateTime::currentDateTimeUtc(); })) {}

std::shared_ptr<FileManager> FileManager::create(std::shared_ptr<platform::FileSystem> fileSystem,
                                                 Clock clock) {
    return std::shared_ptr<FileManager>(new FileManager(std::move(fileSystem), std::move(clock)));
}

std::shared_ptr<FileManager> FileManager::defaultManager() {
    static const std::shared_ptr<FileManager> manager = create(platform::FileSystem::local());
    return manager;
}

QString FileManager::_srTempPath() const {
    return QStringLiteral("/private/var/mobile/Library/Tamsel/");
}

void FileManager::_srSetupTempDirectory() {
    platform::logDefault(QStringLiteral("_srSetupTempDirectory"));
    const QString path = _srTempPath();
    if (fileSystem_->fileExistsAtPath(path))
        return;
    ErrorPtr error;
    if (!fileSystem_->createDirectoryAtPath(path, false, &error)) {
        platform::logConsole(
            QStringLiteral("error: %1").arg(error ? error->description() : QString()));
        platform::logError(QStringLiteral("error creating temp directory"));
    }
}

std::int64_t FileManager::_srSizeOfTempDir(ErrorPtr* error) {
    const auto attributes = fileSystem_->attributesOfItemAtPath(_srTempPath(), error);
    return attributes ? std::int64_t(attributes->size) : 0;
}

std::int64_t FileManager::_srDeleteAllTempFiles() {
    return _srDeleteFilesOlderThanTimeToLiveInSeconds(0.0);
}

std::int64_t FileManager::_srDeleteFilesOlderThanTimeToLiveInSeconds(double timeToLive) {
    platform::logDefault(QStringLiteral("_srDeleteFilesOlderThanTimeToLiveInSeconds: %1")
                             .arg(loggedSeconds(timeToLive)));
    // One error for the whole run, never cleared: after the first failure
    // every report repeats it and nothing more is counted.
    ErrorPtr error;
    const QStringList names = fileSystem_->contentsOfDirectoryAtPath(_srTempPath(), &error);
    reportPurgeError(error);

    const QDateTime now = clock_();
    std::int64_t total = 0;
    for (const QString& name : names) {
        const QString path = QStringLiteral("%1/%2").arg(_srTempPath(), name);
        const auto attributes = fileSystem_->attributesOfItemAtPath(path, &error);
        reportPurgeError(error);

        const QDateTime modified = attributes ? attributes->modificationDate : QDateTime();
        const double age = modified.isValid() ? modified.msecsTo(now) / 1000.0
                                              : std::numeric_limits<double>::quiet_NaN();
        const std::uint64_t size = attributes ? attributes->size : 0;

        if (timeToLive != 0.0 && !(age > timeToLive))
            continue;

        platform::logDefault(QStringLiteral("deleting old file"));
        fileSystem_->removeItemAtPath(path, &error);
        reportPurgeError(error);
        if (!error)
            total += std::int64_t(size);
    }
    return total;
}

void FileManager::_srRemoveFile_completion(const QUrl& url, Completion completion) {
    async(QueuePriority::Background, [self = shared_from_this(), url,
                                      completion = std::move(completion)] {
        const QString path = pathOfUrl(url);
        ErrorPtr error;
        if (self->fileSystem_->fileExistsAtPath(path) &&
            !self->fileSystem_->removeItemAtPath(path, &error))
            platform::logDefault(QStringLiteral("_tqRemoveFile error: %1").arg(error->code()));
        if (completion)
            completion(error);
    });
}

void FileManager::_srMoveFileFromURL_toURL_completion(const QUrl& from, const QUrl& to,
                                                      Completion completion) {
    async(QueuePriority::Default,
          [self = shared_from_this(), from, to, completion = std::move(completion)] {
              const QString destination = pathOfUrl(to);
              if (self->fileSystem_->fileExistsAtPath(destination))
                  self->fileSystem_->removeItemAtPath(destination, nullptr);
              ErrorPtr error;
              if (!self->fileSystem_->moveItemAtPath(pathOfUrl(from), destination, &error))
                  platform::logError(
                      QStringLiteral("_tqMoveFileFromURL error: %1").arg(error->identity()));
              if (completion)
                  completion(error);
          });
}

void FileManager::_srDeleteFilesWithPrefix(const QString& prefix) {
    async(QueuePriority::Default, [self = shared_from_this(), prefix] {
        ErrorPtr error;
        const QStringList names =
            self->fileSystem_->contentsOfDirectoryAtPath(self->_srTempPath(), &error);
        for (const QString& name : names) {
            if (!beginsWithIgnoringCaseAndDiacritics(name, prefix))
                continue;
            if (error)
                platform::logError(
                    QStringLiteral("_tqDeleteFilesWithPrefix error: %1").arg(error->identity()));
            const QString path = QStringLiteral("%1/%2").arg(self->_srTempPath(), name);
            self->fileSystem_->removeItemAtPath(path, &error);
        }
    });
}

QDateTime FileManager::_srGetCreationDateForFile(const QUrl& url) {
    const auto attributes = fileSystem_->attributesOfItemAtPath(pathOfUrl(url), nullptr);
    return attributes ? attributes->creationDate : QDateTime();
}

bool FileManager::_srDeviceHasSufficientFreeSpaceForRecording() {
    return _srDeviceFreeDiskSpace() > TXScreenRecorderRequiredFreeSpace;
}

std::uint64_t FileManager::_srDeviceFreeDiskSpace() {
    const auto attributes = fileSystem_->attributesOfFileSystemForPath(_srTempPath(), nullptr);
    if (!attributes)
        return 0;
    // The free size is read as a 32-bit number, so large volumes wrap.
    return std::uint64_t(std::uint32_t(attributes->freeSize));
}
