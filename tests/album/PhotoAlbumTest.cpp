// The photo album on real files: generated movies in, unique names out, and
// nothing partial or overwritten whatever goes wrong.

#include "MediaGenerator.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/services/album/FolderPhotoAlbum.h"
#include "support/TempDir.h"
#include "support/Wait.h"

#include <QCryptographicHash>
#include <QDir>
#include <QFile>
#include <QTemporaryDir>
#include <atomic>
#include <gtest/gtest.h>
#include <sys/resource.h>

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

TEST_F(PhotoAlbumTest, TheSharedAlbumIsOneAlbumInTheFolderOfItsFirstUse) {
    testing_support::ScopedEnv env("TAMSEL_ALBUM_DIR", folder.toLocal8Bit());
    const std::shared_ptr<PhotoAlbum> shared = PhotoAlbum::sharedAlbum();
    env.set("TAMSEL_ALBUM_DIR", albumRoot.filePath("elsewhere").toLocal8Bit());
    EXPECT_EQ(PhotoAlbum::sharedAlbum(), shared);
    PhotoAlbum::sharedAlbum()->saveVideoAtPathToAlbum(movie());
    GlobalQueue::drain();
    EXPECT_EQ(entries(folder), QStringList{"clip.mp4"});
}
