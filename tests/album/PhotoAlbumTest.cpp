// The photo album on real files: generated movies in, unique names out, and
// nothing partial or overwritten whatever goes wrong.

#include "MediaGenerator.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/services/FileSystem.h"
#include "platform/services/album/FolderPhotoAlbum.h"
#include "support/TempDir.h"
#include "support/Wait.h"

#include <QCryptographicHash>
#include <QDir>
#include <QFile>
#include <QTemporaryDir>
#include <atomic>
#include <gtest/gtest.h>
#include <linux/fs.h>
#include <mutex>
#include <sys/ioctl.h>
#include <sys/resource.h>
#include <sys/stat.h>

using namespace platform;
using testing_support::waitUntil;

namespace {

QByteArray hashOf(const QString& path) {
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly))
        return {};
    return QCryptographicHash::hash(file.readAll(), QCryptographicHash::Sha256);
}

QStringList entries(const QString& folder) {
    QStringList names = QDir(folder).entryList(QDir::Files | QDir::Hidden | QDir::NoDotAndDotDot);
    names.sort();
    return names;
}

class PhotoAlbumTest : public ::testing::Test {
  protected:
    static void SetUpTestSuite() {
        source = new QTemporaryDir;
        testmedia::MovieSpec movieSpec;
        movieSpec.seconds = 1;
        QString error;
        ASSERT_TRUE(testmedia::writeMovie(source->filePath("clip.mp4"), movieSpec, &error))
            << error.toStdString();
    }
    static void TearDownTestSuite() { delete source; }

    QString movie() const { return source->filePath("clip.mp4"); }

    static QTemporaryDir* source;
    QTemporaryDir albumRoot;
    QString folder = albumRoot.filePath("Videos/Screen Recordings");
    FolderPhotoAlbum album{folder};
};
QTemporaryDir* PhotoAlbumTest::source = nullptr;

} // namespace

TEST_F(PhotoAlbumTest, CopiesAVideoInUnderAUniqueNameAndNeverOverwrites) {
    const QByteArray original = hashOf(movie());
    QDir().mkpath(folder);
    QFile taken(folder + "/clip.mp4");
    ASSERT_TRUE(taken.open(QIODevice::WriteOnly));
    taken.write("someone else's file");
    taken.close();

    std::atomic<int> done{0};
    std::atomic<bool> allSucceeded{true};
    for (int i = 0; i < 2; ++i)
        album.performChanges_creationRequestForAssetFromVideoAtFileURL(
            QUrl::fromLocalFile(movie()), [&](bool success, ErrorPtr error) {
                allSucceeded = allSucceeded && success && !error;
                ++done;
            });
    ASSERT_TRUE(waitUntil([&] { return done == 2; }));
    EXPECT_TRUE(allSucceeded);

    EXPECT_EQ(entries(folder), (QStringList{"clip 2.mp4", "clip 3.mp4", "clip.mp4"}));
    EXPECT_EQ(hashOf(folder + "/clip 2.mp4"), original);
    EXPECT_EQ(hashOf(folder + "/clip 3.mp4"), original);
    QFile check(folder + "/clip.mp4");
    ASSERT_TRUE(check.open(QIODevice::ReadOnly));
    EXPECT_EQ(check.readAll(), "someone else's file");
    EXPECT_EQ(hashOf(movie()), original) << "the source is never touched";
}

TEST_F(PhotoAlbumTest, RefusesWhatIsNotPlayableVideo) {
    QFile text(albumRoot.filePath("notes.mp4"));
    ASSERT_TRUE(text.open(QIODevice::WriteOnly));
    text.write("this is not a movie");
    text.close();

    for (const QString& path : {text.fileName(), albumRoot.filePath("missing.mp4")}) {
        ErrorPtr error;
        EXPECT_TRUE(album.importVideo(path, &error).isEmpty());
        ASSERT_TRUE(error) << path.toStdString();
        EXPECT_EQ(error->code(), PhotoAlbum::NotVideo);
    }
    EXPECT_TRUE(entries(folder).isEmpty());
}

TEST_F(PhotoAlbumTest, AFolderThatCannotBeWrittenFailsCleanly) {
    QFile blocker(albumRoot.filePath("Videos"));
    ASSERT_TRUE(blocker.open(QIODevice::WriteOnly)); // a file where the folder should be
    blocker.close();

    std::atomic<bool> done{false};
    ErrorPtr seen;
    album.performChanges_creationRequestForAssetFromVideoAtFileURL(
        QUrl::fromLocalFile(movie()), [&](bool success, ErrorPtr error) {
            EXPECT_FALSE(success);
            seen = error;
            done = true;
        });
    ASSERT_TRUE(waitUntil([&] { return done.load(); }));
    ASSERT_TRUE(seen);
    EXPECT_EQ(seen->code(), PhotoAlbum::NotWritable);
}

TEST_F(PhotoAlbumTest, AFullDiskLeavesNoPartialFile) {
    // A file-size limit below the movie's size stands in for a full disk.
    rlimit saved{};
    ASSERT_EQ(getrlimit(RLIMIT_FSIZE, &saved), 0);
    rlimit small = saved;
    small.rlim_cur = 4096;
    ASSERT_EQ(setrlimit(RLIMIT_FSIZE, &small), 0);
    ErrorPtr error;
    const QString saved_path = album.importVideo(movie(), &error);
    setrlimit(RLIMIT_FSIZE, &saved);

    EXPECT_TRUE(saved_path.isEmpty());
    ASSERT_TRUE(error);
    EXPECT_EQ(error->code(), PhotoAlbum::DiskFull);
    EXPECT_TRUE(entries(folder).isEmpty()) << entries(folder).join(", ").toStdString();
}

TEST_F(PhotoAlbumTest, FireAndForgetSavesFinishBeforeTheQueuesDrain) {
    album.saveVideoAtPathToAlbum(movie());
    GlobalQueue::drain();
    EXPECT_EQ(entries(folder), QStringList{"clip.mp4"});
    EXPECT_EQ(album.lastSavedPath(), folder + "/clip.mp4");
}

// The editor's clips (files of the device's storage) come in without a copy
// of their bytes: a reflink where the file system has them, else a hard link
// to the whole file. A host's file is copied: its owner may change it.
TEST_F(PhotoAlbumTest, TheEditorsClipsComeInWithoutACopyAndHostFilesAreCopied) {
    testing_support::MobileRoot mobile;
    mobile.makeLibrary();
    const QString clip = mobile.hostPath("Library/Tamsel/Racer_1700000000.mp4");
    ASSERT_TRUE(QFile::copy(movie(), clip));
    const QByteArray original = hashOf(clip);
    // Whether this file system shares blocks between files (btrfs, XFS) or
    // not (ext4, tmpfs): then the album's file is the clip itself.
    const bool reflinks = [&] {
        QFile a(mobile.hostPath("probe-a")), b(mobile.hostPath("probe-b"));
        a.open(QIODevice::WriteOnly);
        a.write("x");
        a.flush();
        b.open(QIODevice::WriteOnly);
        return ::ioctl(b.handle(), FICLONE, a.handle()) == 0;
    }();

    struct stat clipInfo {};
    ASSERT_EQ(::stat(QFile::encodeName(clip).constData(), &clipInfo), 0);
    for (const QString& path :
         {QStringLiteral("/private/var/mobile/Library/Tamsel/Racer_1700000000.mp4"), clip}) {
        SCOPED_TRACE(path.toStdString());
        ErrorPtr error;
        const QString saved = album.importVideo(path, &error);
        ASSERT_FALSE(saved.isEmpty()) << error->description().toStdString();
        struct stat savedInfo {};
        ASSERT_EQ(::stat(QFile::encodeName(saved).constData(), &savedInfo), 0);
        if (reflinks || clipInfo.st_dev != savedInfo.st_dev)
            EXPECT_NE(savedInfo.st_ino, clipInfo.st_ino);
        else
            EXPECT_EQ(savedInfo.st_ino, clipInfo.st_ino) << "a hard link, not a copy";
        EXPECT_EQ(hashOf(saved), original);
    }
    EXPECT_EQ(entries(folder), (QStringList{"Racer_1700000000 2.mp4", "Racer_1700000000.mp4"}));
    // The editor removes its clip; the album's stays whole.
    ASSERT_TRUE(QFile::remove(clip));
    EXPECT_EQ(hashOf(folder + "/Racer_1700000000.mp4"), original);

    // The host's recording, on the same file system, is copied.
    const QString host = albumRoot.filePath("recording.mp4");
    ASSERT_TRUE(QFile::copy(movie(), host));
    struct stat hostInfo {};
    ASSERT_EQ(::stat(QFile::encodeName(host).constData(), &hostInfo), 0);
    ErrorPtr error;
    const QString saved = album.importVideo(host, &error);
    struct stat savedInfo {};
    ASSERT_EQ(::stat(QFile::encodeName(saved).constData(), &savedInfo), 0);
    EXPECT_NE(savedInfo.st_ino, hostInfo.st_ino);
    EXPECT_EQ(savedInfo.st_nlink, 1u);
}

TEST_F(PhotoAlbumTest, TheSharedAlbumIsOneAlbumInTheFolderOfItsFirstUse) {
    testing_support::ScopedEnv env("TAMSEL_ALBUM_DIR", folder.toLocal8Bit());
    const std::shared_ptr<PhotoAlbum> shared = PhotoAlbum::sharedAlbum();
    env.set("TAMSEL_ALBUM_DIR", albumRoot.filePath("elsewhere").toLocal8Bit());
    EXPECT_EQ(PhotoAlbum::sharedAlbum(), shared);
    PhotoAlbum::sharedAlbum()->saveVideoAtPathToAlbum(movie());
    GlobalQueue::drain();
    EXPECT_EQ(entries(folder), QStringList{"clip.mp4"});
}

TEST_F(PhotoAlbumTest, ARemovalAskedAfterASaveWaitsUntilTheImportHasTheFile) {
    // The editor's tear-down removes its clip right after asking the album to
    // save it; the removal runs on another queue and must not win.
    const QString clip = albumRoot.filePath("Racer_1.mp4");
    ASSERT_TRUE(QFile::copy(movie(), clip));
    // Every worker of the album's queue busy, so the import has to wait.
    std::mutex gate;
    std::unique_lock closed(gate);
    for (int i = 0; i < 64; ++i)
        GlobalQueue::async(QueuePriority::Default, [&gate] { std::lock_guard pass(gate); });
    album.saveVideoAtPathToAlbum(clip);
    std::atomic<bool> removed{false};
    GlobalQueue::async(QueuePriority::Background, [&] {
        FileSystem::local()->removeItemAtPath(clip, nullptr);
        removed = true;
    });
    EXPECT_FALSE(waitUntil([&] { return removed.load(); }, 300)) << "the removal overtook";
    closed.unlock();
    GlobalQueue::drain();
    EXPECT_TRUE(removed);
    EXPECT_FALSE(QFile::exists(clip));
    EXPECT_EQ(entries(folder), QStringList{"Racer_1.mp4"});
    EXPECT_EQ(hashOf(folder + "/Racer_1.mp4"), hashOf(movie()));
}

TEST_F(PhotoAlbumTest, APipeOrADeviceIsRefusedWithoutWaitingOnIt) {
    const QString fifo = albumRoot.filePath("recording.mp4");
    ASSERT_EQ(::mkfifo(fifo.toLocal8Bit().constData(), 0600), 0);
    for (const QString& path : {fifo, QStringLiteral("/dev/zero"), albumRoot.path()}) {
        ErrorPtr error;
        EXPECT_TRUE(album.importVideo(path, &error).isEmpty()) << path.toStdString();
        ASSERT_TRUE(error) << path.toStdString();
        EXPECT_EQ(error->code(), PhotoAlbum::NotVideo);
    }
    EXPECT_TRUE(entries(folder).isEmpty());
}

TEST_F(PhotoAlbumTest, ANameThatStartsWithADotIsNotHiddenInTheAlbum) {
    const QStringList sources = {"..\u2215..\u2215evil_1.mp4", "..._2.mp4", ".mp4"};
    const QStringList expected = {"Video.mp4", "_2.mp4", "evil_1.mp4"};
    for (const QString& name : sources) {
        const QString path = albumRoot.filePath(name);
        ASSERT_TRUE(QFile::copy(movie(), path));
        ErrorPtr error;
        EXPECT_FALSE(album.importVideo(path, &error).isEmpty()) << name.toStdString();
    }
    QStringList names = entries(folder);
    for (QString& name : names)
        name = name.section(QChar(0x2215), -1);
    names.sort();
    EXPECT_EQ(names, expected);
}
