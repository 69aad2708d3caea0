// The photo album on real files: generated movies in, unique names out, and
// nothing partial or overwritten whatever goes wrong.

#include "MediaGenerator.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/services/FileSystem.h"
#include "platform/services/album/FolderPhotoAlbum.h"
#include "support/TempDir.h"
#include "support/Wait.h"

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
using testing_support::hashOf;
using testing_support::waitUntil;

namespace {

QStringList entries(const QString& folder) {
    QStringList names = QDir(folder).entryList(QDir::Files | QDir::Hidden | QDir::NoDotAndDotDot);
    names.sort();
    return names;
}

struct stat statOf(const QString& path) {
    struct stat info {};
    EXPECT_EQ(::stat(QFile::encodeName(path).constData(), &info), 0) << path.toStdString();
    return info;
}

class PhotoAlbumTest : public ::testing::Test {
  protected:
    static void SetUpTestSuite() {
        source = new QTemporaryDir;
        QString error;
        ASSERT_TRUE(testmedia::writeMovie(source->filePath("clip.mp4"), {.seconds = 1}, &error))
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

// What is not a playable video, or not a regular file (a pipe, a device, a
// folder: refused without waiting on it), does not come in.
TEST_F(PhotoAlbumTest, RefusesWhatIsNotPlayableVideo) {
    QFile text(albumRoot.filePath("notes.mp4"));
    ASSERT_TRUE(text.open(QIODevice::WriteOnly));
    text.write("this is not a movie");
    text.close();
    const QString fifo = albumRoot.filePath("recording.mp4");
    ASSERT_EQ(::mkfifo(fifo.toLocal8Bit().constData(), 0600), 0);
    for (const QString& path : {text.fileName(), albumRoot.filePath("missing.mp4"), fifo,
                                QStringLiteral("/dev/zero"), albumRoot.path()}) {
        ErrorPtr error;
        EXPECT_TRUE(album.importVideo(path, &error).isEmpty()) << path.toStdString();
        ASSERT_TRUE(error) << path.toStdString();
        EXPECT_EQ(error->code(), PhotoAlbum::NotVideo);
    }
    EXPECT_TRUE(entries(folder).isEmpty());
}

// A folder that cannot be written (a file where it should be), or a disk
// that fills up (a file-size limit below the movie's size stands in), fails
// with its code and leaves no partial file.
TEST_F(PhotoAlbumTest, AnUnwritableFolderOrAFullDiskFailsCleanly) {
    rlimit saved{};
    ASSERT_EQ(getrlimit(RLIMIT_FSIZE, &saved), 0);
    rlimit small = saved;
    small.rlim_cur = 4096;
    ASSERT_EQ(setrlimit(RLIMIT_FSIZE, &small), 0);
    ErrorPtr full;
    const QString written = album.importVideo(movie(), &full);
    setrlimit(RLIMIT_FSIZE, &saved);
    EXPECT_TRUE(written.isEmpty());
    ASSERT_TRUE(full);
    EXPECT_EQ(full->code(), PhotoAlbum::DiskFull);
    EXPECT_TRUE(entries(folder).isEmpty()) << entries(folder).join(", ").toStdString();

    QDir(albumRoot.filePath("Videos")).removeRecursively();
    QFile blocker(albumRoot.filePath("Videos"));
    ASSERT_TRUE(blocker.open(QIODevice::WriteOnly));
    blocker.close();
    ErrorPtr unwritable;
    EXPECT_TRUE(album.importVideo(movie(), &unwritable).isEmpty());
    ASSERT_TRUE(unwritable);
    EXPECT_EQ(unwritable->code(), PhotoAlbum::NotWritable);
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

    const struct stat clipInfo = statOf(clip);
    for (const QString& path :
         {QStringLiteral("/private/var/mobile/Library/Tamsel/Racer_1700000000.mp4"), clip}) {
        SCOPED_TRACE(path.toStdString());
        ErrorPtr error;
        const QString saved = album.importVideo(path, &error);
        ASSERT_FALSE(saved.isEmpty()) << error->description().toStdString();
        const struct stat savedInfo = statOf(saved);
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
    const struct stat savedInfo = statOf(album.importVideo(host, nullptr));
    EXPECT_NE(savedInfo.st_ino, statOf(host).st_ino);
    EXPECT_EQ(savedInfo.st_nlink, 1u);
}

// Fire-and-forget saves finish before the queues drain.
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
