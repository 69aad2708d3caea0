// The queued operations of the temporary store: removal, move and deletion by
// prefix, their queues, completions and logs.

#include "FileManagerFixture.h"
#include "platform/runtime/GlobalQueue.h"
#include "support/Wait.h"

#include <QCoreApplication>
#include <QThread>
#include <atomic>

using platform::ErrorPtr;
using platform::LogLevel;
using testing_support::waitUntil;

namespace {

// What a completion saw, filled on the worker thread.
struct Outcome {
    std::atomic<bool> called{false};
    std::atomic<bool> onMainThread{true};
    std::atomic<bool> onWorker{false};
    ErrorPtr error;

    FileManager::Completion completion() {
        return [this](ErrorPtr e) {
            error = std::move(e);
            onMainThread = QThread::currentThread() == QCoreApplication::instance()->thread();
            onWorker = platform::GlobalQueue::isWorkerThread();
            called = true;
        };
    }
    bool wait() {
        return waitUntil([this] { return called.load(); });
    }
};

QByteArray contents(const QString& path) {
    QFile file(path);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

} // namespace

// On a worker thread; removing nothing is no error; a failure is logged
// with its code at default level.
TEST_F(FileManagerFixture, RemovalCompletesOnAWorkerThreadAndLogsOnlyAFailure) {
    addFile("clip.mp4", 5);
    addFile("locked.mp4", 5);
    fileSystem->failRemovalOf("locked.mp4", 13);
    for (const char* name : {"clip.mp4", "never-there.mp4", "locked.mp4"}) {
        SCOPED_TRACE(name);
        Outcome outcome;
        manager->_srRemoveFile_completion(tempUrl(name), outcome.completion());
        ASSERT_TRUE(outcome.wait());
        EXPECT_FALSE(outcome.onMainThread);
        EXPECT_TRUE(outcome.onWorker);
        EXPECT_EQ(outcome.error ? outcome.error->code() : 0, name[0] == 'l' ? 13 : 0);
    }
    EXPECT_FALSE(exists("clip.mp4"));
    EXPECT_EQ(fileSystem->removals(), (QStringList{"clip.mp4", "locked.mp4"}));
    EXPECT_EQ(logs.lines(),
              (QList<testing_support::LogLine>{{LogLevel::Default, "_tqRemoveFile error: 13"}}));

    // Without a completion the job still runs to its end.
    addFile("quiet.mp4", 1);
    manager->_srRemoveFile_completion(tempUrl("quiet.mp4"), nullptr);
    platform::GlobalQueue::drain();
    EXPECT_FALSE(exists("quiet.mp4"));
}

TEST_F(FileManagerFixture, AQueuedJobKeepsItsFileManagerAlive) {
    addFile("clip.mp4", 5);
    std::weak_ptr<FileManager> weak = manager;
    std::atomic<bool> aliveInCompletion{false};
    std::atomic<bool> called{false};
    manager->_srRemoveFile_completion(tempUrl("clip.mp4"), [&](ErrorPtr) {
        aliveInCompletion = !weak.expired();
        called = true;
    });
    manager.reset();
    ASSERT_TRUE(waitUntil([&] { return called.load(); }));
    EXPECT_TRUE(aliveInCompletion);
    platform::GlobalQueue::drain();
    EXPECT_TRUE(waitUntil([&] { return weak.expired(); }));
}

// A move replaces the destination; a missing source reports and logs the
// error's identity.
TEST_F(FileManagerFixture, MoveReplacesTheDestinationOrReportsAMissingSource) {
    testing_support::writeFile(tempHost("new.mp4"), 3);
    testing_support::writeFile(tempHost("old.mp4"), 9);
    testing_support::writeFile(tempHost("kept.mp4"), 4);
    Outcome moved;
    manager->_srMoveFileFromURL_toURL_completion(tempUrl("new.mp4"), tempUrl("old.mp4"),
                                                 moved.completion());
    ASSERT_TRUE(moved.wait());
    EXPECT_FALSE(moved.error);
    EXPECT_FALSE(moved.onMainThread);
    EXPECT_FALSE(exists("new.mp4"));
    EXPECT_EQ(contents(tempHost("old.mp4")).size(), 3);
    EXPECT_TRUE(logs.texts().isEmpty());

    Outcome missing;
    manager->_srMoveFileFromURL_toURL_completion(tempUrl("gone.mp4"), tempUrl("other.mp4"),
                                                 missing.completion());
    ASSERT_TRUE(missing.wait());
    ASSERT_TRUE(missing.error);
    EXPECT_EQ(missing.error->code(), 2);
    EXPECT_EQ(
        logs.lines(),
        (QList<testing_support::LogLine>{
            {LogLevel::Error,
             QStringLiteral("_tqMoveFileFromURL error: %1").arg(missing.error->identity())}}));
    EXPECT_TRUE(exists("kept.mp4"));
}

TEST_F(FileManagerFixture, DeletionByPrefixIgnoresCaseAndAccents) {
    for (const char* name : {"abc.mp4", "ABC_1.mp4", "ábc.mov", "Ábc 2.mov", "xabc.mp4", "ab.mp4"})
        addFile(QString::fromUtf8(name), 1);
    // The same letters written decomposed, as some file systems store them.
    addFile(QStringLiteral("a\u0301bc-decomposed.mp4"), 1);

    manager->_srDeleteFilesWithPrefix(QStringLiteral("abc"));
    platform::GlobalQueue::drain();

    QStringList left = QDir(tempHost()).entryList(QDir::Files);
    left.sort();
    EXPECT_EQ(left, (QStringList{"ab.mp4", "xabc.mp4"}));
    EXPECT_TRUE(logs.texts().isEmpty());
}

// A failure is carried and logged before each later entry's removal, so a
// failure of the last entry is never logged.
TEST_F(FileManagerFixture, DeletionByPrefixLogsACarriedErrorBeforeEachLaterEntry) {
    for (const char* failing : {"abc1", "abc3"}) {
        SCOPED_TRACE(failing);
        for (const char* name : {"abc1", "abc2", "abc3"})
            addFile(name, 1);
        auto fileSystem = std::make_shared<testing_support::ScriptedFileSystem>();
        fileSystem->failRemovalOf(failing);
        logs.clear();
        FileManager::create(fileSystem)->_srDeleteFilesWithPrefix("ABC");
        platform::GlobalQueue::drain();

        const auto lines = logs.lines();
        ASSERT_EQ(lines.size(), failing == QLatin1String("abc1") ? 2 : 0);
        for (const auto& line : lines)
            EXPECT_EQ(line, lines[0]) << "the same error, logged again";
        if (!lines.isEmpty()) {
            EXPECT_EQ(lines[0].level, LogLevel::Error);
            EXPECT_TRUE(lines[0].text.startsWith("_tqDeleteFilesWithPrefix error: "));
        }
        EXPECT_EQ(QDir(tempHost()).entryList(QDir::Files), QStringList{failing});
    }
}

TEST(FileManagerMissingDirectory, DeletionByPrefixDoesNothingQuietly) {
    testing_support::MobileRoot root;
    testing_support::LogCapture logs;
    FileManager::create(platform::FileSystem::local())->_srDeleteFilesWithPrefix("abc");
    platform::GlobalQueue::drain();
    EXPECT_TRUE(logs.texts().isEmpty());
}
