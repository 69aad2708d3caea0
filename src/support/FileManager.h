#pragma once

#include "platform/runtime/Error.h"
#include "platform/services/FileSystem.h"

#include <QDateTime>
#include <QString>
#include <QUrl>
#include <cstdint>
#include <functional>
#include <memory>

// Absolute device path of the framework's temporary directory; ends with "/".
extern const QString TXScreenRecorderTempDirectory;
// Free bytes a recording needs: 10^8, not a power of two.
extern const std::uint64_t TXScreenRecorderRequiredFreeSpace;

// The file manager with the temporary-store operations of the TXExtensions
// group. It acts on the file system only through the FileSystem it was made
// with, so tests can hand it a file system of their own.
//
// Failures are logged and swallowed; nothing throws. The synchronous
// operations run on the caller's thread; removal, move and deletion by prefix
// queue one job on a global worker queue and return at once. A job keeps the
// file manager and its arguments alive until it ends, and calls its completion
// (if any) on the worker thread that ran it, never on the main thread.
class FileManager : public std::enable_shared_from_this<FileManager> {
  public:
    using Completion = std::function<void(platform::ErrorPtr error)>;
    using Clock = std::function<QDateTime()>;

    // `clock` gives the current time for the purge by age; the system clock
    // when null.
    static std::shared_ptr<FileManager> create(std::shared_ptr<platform::FileSystem> fileSystem,
                                               Clock clock = nullptr);
    // The process's file manager, on the local file system.
    static std::shared_ptr<FileManager> defaultManager();

    platform::FileSystem& fileSystem() const { return *fileSystem_; }

    // "/private/var/mobile/Library/Tamsel/".
    QString _srTempPath() const;

    // Creates the temporary directory unless something is already there.
    void _srSetupTempDirectory();

    // The size attribute of the directory entry itself (not of its contents);
    // 0 when it cannot be read, with the error passed out through `error`.
    std::int64_t _srSizeOfTempDir(platform::ErrorPtr* error);

    // Removes every entry of the directory; returns the bytes removed.
    std::int64_t _srDeleteAllTempFiles();

    // Removes the entries whose age (now minus modification date) is greater
    // than `timeToLive` seconds; 0.0 removes all, NaN none. Returns the bytes
    // removed, counting only until the first failure of the run.
    std::int64_t _srDeleteFilesOlderThanTimeToLiveInSeconds(double timeToLive);

    // Removes the file at `url` on the background-priority queue. The
    // completion gets null on success and when there was nothing to remove.
    void _srRemoveFile_completion(const QUrl& url, Completion completion);

    // Moves `from` onto `to` (replacing what is there) on the default-priority
    // queue. The completion gets null on success, else the move's error.
    void _srMoveFileFromURL_toURL_completion(const QUrl& from, const QUrl& to,
                                             Completion completion);

    // Removes the entries whose names begin with `prefix`, ignoring case and
    // diacritics, on the default-priority queue.
    void _srDeleteFilesWithPrefix(const QString& prefix);

    // The file's creation date; an invalid QDateTime when it cannot be read.
    QDateTime _srGetCreationDateForFile(const QUrl& url);

    // True exactly when _srDeviceFreeDiskSpace() > TXScreenRecorderRequiredFreeSpace.
    bool _srDeviceHasSufficientFreeSpaceForRecording();

    // Free bytes of the volume holding the temporary directory, read as an
    // unsigned 32-bit number (so modulo 2^32); 0 when it cannot be read.
    std::uint64_t _srDeviceFreeDiskSpace();

  private:
    FileManager(std::shared_ptr<platform::FileSystem> fileSystem, Clock clock);

    std::shared_ptr<platform::FileSystem> fileSystem_;
    Clock clock_;
};
