// The synchronous operations of the temporary store: set-up, purges, size,
// creation date and free space.

#include "FileManagerFixture.h"

#include <QDir>
#include <QFileInfo>
#include <cmath>
#include <fcntl.h>
#include <functional>
#include <limits>
#include <linux/fs.h>
#include <sys/ioctl.h>
#include <unistd.h>

using platform::LogLevel;

namespace {
const QString kPurgeError = QStringLiteral(
    "error in _tqRemoveFile_srDeleteFilesOlderThanTimeToLiveInSeconds, error code: %1");
}

TEST(FileManagerSetup, CreatesTheDirectoryAndLeavesAnythingAlreadyThere) {
    testing_support::MobileRoot root;
    root.makeLibrary(false);
    testing_support::LogCapture logs;
    auto manager = FileManager::create(platform::FileSystem::local());

    manager->_srSetupTempDirectory();
    EXPECT_TRUE(QFileInfo(root.hostPath("Library/Tamsel")).isDir());
    manager->_srSetupTempDirectory();
    EXPECT_EQ(logs.lines(),
              (QList<testing_support::LogLine>{{LogLevel::Default, "_srSetupTempDirectory"},
                                               {LogLevel::Default, "_srSetupTempDirectory"}}));

    // A plain file of that name is not replaced.
    QDir(root.hostPath("Library/Tamsel")).removeRecursively();
    testing_support::writeFile(root.hostPath("Library/Tamsel"), 3);
    manager->_srSetupTempDirectory();
    EXPECT_TRUE(QFileInfo(root.hostPath("Library/Tamsel")).isFile());
    EXPECT_EQ(logs.texts().count(), 3) << logs.texts().join(" | ").toStdString();
}

TEST(FileManagerSetup, FailureGoesToTheConsoleAndThenTheErrorLog) {
    testing_support::MobileRoot root; // no Library folder: parents are never created
    testing_support::LogCapture logs;
    FileManager::create(platform::FileSystem::local())->_srSetupTempDirectory();

    const auto lines = logs.lines();
    ASSERT_EQ(lines.size(), 3);
    EXPECT_EQ(lines[0], (testing_support::LogLine{LogLevel::Default, "_srSetupTempDirectory"}));
    EXPECT_EQ(lines[1].level, LogLevel::Console);
    EXPECT_TRUE(lines[1].text.startsWith("error: Error Domain=POSIX Code=2 "))
        << lines[1].text.toStdString();
    EXPECT_TRUE(lines[1].text.contains("/private/var/mobile/Library/Tamsel/"))
        << "logs speak of device paths";
    EXPECT_EQ(lines[2],
              (testing_support::LogLine{LogLevel::Error, "error creating temp directory"}));
    EXPECT_FALSE(QFileInfo::exists(root.hostPath("Library")));
}

// Entries older than the time to live go, one exactly as old stays; zero and
// negative times remove everything, even what was made now, and NaN
// nothing; the time is logged clamped to 32 bits.
TEST_F(FileManagerFixture, PurgeRemovesEntriesOlderThanTheTimeToLive) {
    const QStringList all = {"exactly.mp4", "now.mp4", "old.mp4"};
    const struct {
        double timeToLive;
        QString logged;
        QStringList kept;
    } cases[] = {
        {100, "100", {"exactly.mp4", "now.mp4"}},
        {0, "0", {}},
        {-3.9, "-3", {}},
        {-1e12, "-2147483648", {}},
        {1e12, "2147483647", all},
        {std::numeric_limits<double>::quiet_NaN(), "0", all},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.timeToLive);
        addFile("old.mp4", 1000, 200);
        addFile("exactly.mp4", 2000, 100);
        addFile("now.mp4", 4000, 0);
        logs.clear();
        qint64 removed = 0;
        for (const QString& name : all)
            removed += c.kept.contains(name) ? 0 : QFileInfo(tempHost(name)).size();

        EXPECT_EQ(manager->_srDeleteFilesOlderThanTimeToLiveInSeconds(c.timeToLive), removed);
        EXPECT_EQ(QDir(tempHost()).entryList(QDir::Files), c.kept);
        EXPECT_EQ(logs.texts().first(), "_srDeleteFilesOlderThanTimeToLiveInSeconds: " + c.logged);
        EXPECT_EQ(logs.count("deleting old file"), all.size() - c.kept.size());
        EXPECT_EQ(logs.texts().size(), 1 + all.size() - c.kept.size());
        QDir(tempHost()).removeRecursively();
        root.makeLibrary();
    }
    // Folders are entries alike: deleting every file is the purge with zero.
    QDir().mkpath(tempHost("folder/inner"));
    logs.clear();
    manager->_srDeleteAllTempFiles();
    EXPECT_TRUE(QDir(tempHost()).isEmpty());
    EXPECT_EQ(logs.texts().first(), "_srDeleteFilesOlderThanTimeToLiveInSeconds: 0");
}

TEST_F(FileManagerFixture, PurgeCarriesTheFirstFailureToTheEnd) {
    addFile("a.mp4", 10, 500);
    addFile("b.mp4", 20, 500);
    addFile("c.mp4", 40, 500);
    fileSystem->failRemovalOf("b.mp4", 13);

    EXPECT_EQ(manager->_srDeleteFilesOlderThanTimeToLiveInSeconds(60), 10)
        << "removals after the failure still happen but are not counted";
    EXPECT_EQ(fileSystem->removals(), (QStringList{"a.mp4", "b.mp4", "c.mp4"}));
    EXPECT_FALSE(exists("c.mp4"));

    // Reported after b's removal, after c's attributes and after c's removal.
    EXPECT_EQ(logs.count(LogLevel::Error, kPurgeError.arg(13)), 3);
    const auto console = logs.startingWith("error = ");
    ASSERT_EQ(console.size(), 3);
    EXPECT_EQ(console[0].level, LogLevel::Console);
    EXPECT_TRUE(console[0].text.contains("Code=13"));
}

TEST_F(FileManagerFixture, UnreadableAttributesKeepTheEntryButPoisonTheTotal) {
    addFile("a.mp4", 10, 500);
    addFile("b.mp4", 20, 500);
    fileSystem->failAttributesOf("a.mp4");

    EXPECT_EQ(manager->_srDeleteFilesOlderThanTimeToLiveInSeconds(60), 0);
    EXPECT_TRUE(exists("a.mp4")) << "an entry of unknown age is not older than anything";
    EXPECT_FALSE(exists("b.mp4"));
    EXPECT_EQ(logs.count(LogLevel::Error, kPurgeError.arg(5)), 3);
}

TEST(FileManagerMissingDirectory, PurgeReportsOnceAndRemovesNothing) {
    testing_support::MobileRoot root;
    testing_support::LogCapture logs;
    auto manager = FileManager::create(platform::FileSystem::local());

    EXPECT_EQ(manager->_srDeleteFilesOlderThanTimeToLiveInSeconds(0), 0);
    EXPECT_EQ(logs.count(LogLevel::Error, kPurgeError.arg(2)), 1);
    EXPECT_EQ(logs.count("deleting old file"), 0);

    platform::ErrorPtr error;
    EXPECT_EQ(manager->_srSizeOfTempDir(&error), 0);
    ASSERT_TRUE(error);
    EXPECT_EQ(error->code(), 2);
    EXPECT_EQ(manager->_srSizeOfTempDir(nullptr), 0);

    EXPECT_EQ(manager->_srDeviceFreeDiskSpace(), 0u);
    EXPECT_FALSE(manager->_srDeviceHasSufficientFreeSpaceForRecording());
}

TEST_F(FileManagerFixture, SizeOfTempDirIsTheDirectoryEntryNotItsContents) {
    addFile("big.mp4", 1 << 20);
    platform::ErrorPtr error;
    const std::int64_t size = manager->_srSizeOfTempDir(&error);
    EXPECT_FALSE(error);
    EXPECT_EQ(
        size,
        std::int64_t(
            fileSystem->attributesOfItemAtPath(TXScreenRecorderTempDirectory, nullptr)->size));
    EXPECT_LT(size, 1 << 20);
}

TEST_F(FileManagerFixture, CreationDateOfAFileOrNone) {
    addFile("clip.mp4", 1);
    const QDateTime created = manager->_srGetCreationDateForFile(tempUrl("clip.mp4"));
    ASSERT_TRUE(created.isValid());
    EXPECT_LT(std::abs(created.secsTo(QDateTime::currentDateTimeUtc())), 600);
    EXPECT_FALSE(manager->_srGetCreationDateForFile(tempUrl("missing.mp4")).isValid());
    EXPECT_TRUE(logs.texts().isEmpty());
}

TEST_F(FileManagerFixture, FreeSpaceIsRead32BitsWideAndMustExceedTheRequirement) {
    struct Case {
        std::uint64_t reported;
        std::uint64_t read;
        bool sufficient;
    };
    const std::uint64_t fourGiB = std::uint64_t(1) << 32;
    const Case cases[] = {
        {100000000, 100000000, false},    {100000001, 100000001, true},
        {fourGiB + 10, 10, false},        {fourGiB + 100000001, 100000001, true},
        {fourGiB - 1, fourGiB - 1, true},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.reported);
        fileSystem->setFreeSize(c.reported);
        EXPECT_EQ(manager->_srDeviceFreeDiskSpace(), c.read);
        EXPECT_EQ(manager->_srDeviceHasSufficientFreeSpaceForRecording(), c.sufficient);
    }
}

namespace {

// Makes `path` a file nothing may delete: immutable where the file system
// and our privileges allow it (as root), else in a folder we cannot write.
// Returns the undo, or null when neither works here.
std::function<void()> makeUndeletable(const QString& folder, const QString& name) {
    const QString path = folder + "/" + name;
    testing_support::writeFile(path, 100);
    const int fd = ::open(QFile::encodeName(path).constData(), O_RDONLY | O_CLOEXEC);
    int flags = 0;
    if (fd >= 0 && ::ioctl(fd, FS_IOC_GETFLAGS, &flags) == 0) {
        flags |= FS_IMMUTABLE_FL;
        if (::ioctl(fd, FS_IOC_SETFLAGS, &flags) == 0)
            return [fd, flags] {
                int cleared = flags & ~FS_IMMUTABLE_FL;
                ::ioctl(fd, FS_IOC_SETFLAGS, &cleared);
                ::close(fd);
            };
    }
    if (fd >= 0)
        ::close(fd);
    if (::geteuid() != 0) {
        // Not root: a folder entry whose contents we may not remove.
        const QString locked = folder + "/" + name + ".d";
        testing_support::writeFile(locked + "/inside", 100);
        QFile::setPermissions(locked, QFileDevice::ReadOwner | QFileDevice::ExeOwner);
        return [locked] {
            QFile::setPermissions(locked, QFileDevice::ReadOwner | QFileDevice::WriteOwner |
                                              QFileDevice::ExeOwner);
        };
    }
    return nullptr;
}

} // namespace

TEST(FileManagerOnDisk, APurgeThatMeetsAnEntryItCannotDeleteRemovesTheRestAndGoesOn) {
    testing_support::MobileRoot root;
    root.makeLibrary();
    const QString folder = root.hostPath("Library/Tamsel");
    testing_support::writeFile(folder + "/a.mp4", 10);
    testing_support::writeFile(folder + "/z.mp4", 20);
    const auto undo = makeUndeletable(folder, "locked.mp4");
    if (!undo)
        GTEST_SKIP() << "no way to make an undeletable file here";
    testing_support::LogCapture logs;
    const auto manager = FileManager::create(platform::FileSystem::local());

    const qint64 removed = manager->_srDeleteFilesOlderThanTimeToLiveInSeconds(0);
    undo();
    EXPECT_FALSE(QFile::exists(folder + "/a.mp4"));
    EXPECT_FALSE(QFile::exists(folder + "/z.mp4")) << "the purge goes on past the failure";
    EXPECT_LE(removed, 30);
    EXPECT_FALSE(
        logs.startingWith("error in _tqRemoveFile_srDeleteFilesOlderThanTimeToLiveInSeconds")
            .isEmpty());
    EXPECT_FALSE(QDir(folder).isEmpty()) << "what could not go is still there, whole";
}
