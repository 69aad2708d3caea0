// Faults on the way: a full disk, an album that cannot be written, a host or
// an extension killed at the worst moment. (The host ending the editor the
// instant a trimmed save finishes is RepeatedUse's typical use.) Each ends with nothing lost and
// nothing partial: the recording untouched, no clip left half-written in the album or the temporary
// store.

#include "EndToEndFixture.h"
#include "MediaGenerator.h"
#include "support/ProcessProbe.h"

#include <QDir>
#include <QFile>
#include <QProcess>
#include <QStorageInfo>
#include <QtEndian>
#include <csignal>
#include <sys/stat.h>

using testing_support::childOf;
using testing_support::pollUntil;
using testing_support::processEnded;

namespace {

QProcessEnvironment loggingToStderr() {
    QProcessEnvironment environment;
    environment.insert("TAMSEL_LOG_STDERR", "1");
    return environment;
}

// A recording made longer by a free box of `padding` bytes at its end, which
// players skip: a large file that is quick to make.
bool writeLargeRecording(const QString& path, const QString& from, qint64 padding) {
    QFile file(path);
    if (!QFile::copy(from, path) || !file.open(QIODevice::Append))
        return false;
    QByteArray header(4, '\0');
    qToBigEndian(quint32(padding), header.data());
    file.write(header + "free");
    const QByteArray block(1 << 20, '\0');
    for (qint64 left = padding - 8; left > 0; left -= block.size())
        if (file.write(block.constData(), qMin<qint64>(left, block.size())) < 0)
            return false;
    return file.flush();
}

} // namespace

using Faults = EndToEnd;

TEST_F(Faults, ADiskThatFillsUpMidExportLeavesNothingBehind) {
    // A file size limit stands in for the full disk: the write that crosses
    // it fails as it would on a full one, at once and on any file system.
    const QByteArray original = hashOf(recording());
    launchPrefix = {"prlimit", "--fsize=30000"};
    // After a failed export the editor stays in trimming, undo disabled: the
    // user closes the window.
    const Run run = edit("wait ready\ndrag end 9\ntap trimButton\nwait log \"Export Trim Video\" "
                         "60\ndismiss\n",
                         {}, {}, loggingToStderr());
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    EXPECT_TRUE(run.err.contains("TQVideoEditorViewController: Export Trim Video Failed, due to "
                                 "error: "))
        << run.err.toStdString();
    EXPECT_EQ(run.hostReport, "[]");
    EXPECT_TRUE(tempFiles().isEmpty()) << tempFiles().join(", ").toStdString();
    EXPECT_TRUE(albumFiles().isEmpty());
    EXPECT_EQ(hashOf(recording()), original);
}

TEST_F(Faults, AnAlbumThatCannotBeWrittenLosesNothing) {
    // Where the album folder should be, there is a file.
    QFile blocker(mobile.filePath("not-a-folder"));
    ASSERT_TRUE(blocker.open(QIODevice::WriteOnly));
    blocker.close();
    QProcessEnvironment env = loggingToStderr();
    env.insert("TAMSEL_ALBUM_DIR", blocker.fileName() + "/Screen Recordings");
    const QByteArray original = hashOf(recording());

    const Run trimmed = edit("wait ready\ndrag end 4\ntap trimButton\nwait exporting=false "
                             "60\nwait log \"photo album\" 30\ntap doneButton\n",
                             {}, {}, env);
    ASSERT_EQ(trimmed.exitCode, 0) << trimmed.err.toStdString();
    EXPECT_TRUE(trimmed.err.contains("photo album: ")) << trimmed.err.toStdString();
    EXPECT_TRUE(tempFiles().isEmpty()) << tempFiles().join(", ").toStdString();

    const Run untrimmed = edit("wait ready\ntap saveButton\n", {}, {}, env);
    ASSERT_EQ(untrimmed.exitCode, 0) << untrimmed.err.toStdString();
    EXPECT_EQ(untrimmed.hostReport, kSavedToAlbumReport);
    EXPECT_TRUE(untrimmed.err.contains("Error writing video to camera roll: 3310"))
        << untrimmed.err.toStdString();
    EXPECT_EQ(hashOf(recording()), original);
    EXPECT_TRUE(QFileInfo(blocker.fileName()).isFile());
}

TEST_F(Faults, AHostKilledDuringAnExportLeavesNoPartialClip) {
    const QString movie = mobile.filePath("long.mp4");
    // Reordered frames: the export goes through the remuxer.
    ASSERT_TRUE(
        testmedia::writeMovie(movie, {.width = 640, .height = 360, .seconds = 20, .bFrames = 2}));
    const QByteArray original = hashOf(movie);

    QProcess host;
    start(host, "wait ready\ndrag end 19\ntap trimButton\nsleep 60\n", movie);
    qint64 extension = 0;
    ASSERT_TRUE(pollUntil([&] { return (extension = childOf(host.processId())) != 0; }, 20000));
    // The moment the export's first file shows in the store, the host dies.
    const bool seen = pollUntil([&] { return !tempFiles().isEmpty(); }, 60000);
    host.kill();
    host.waitForFinished();
    ASSERT_TRUE(pollUntil([&] { return processEnded(extension); }, 60000, 20))
        << "the extension outlived its host";
    RecordProperty("exportSeenBeforeTheKill", seen ? "yes" : "no");
    EXPECT_TRUE(tempFiles().isEmpty()) << tempFiles().join(", ").toStdString();
    expectWholeClipsOnly(19.0);
    EXPECT_EQ(hashOf(movie), original);
}

TEST_F(Faults, AnExtensionKilledDuringAnAlbumWriteLeavesNoPartialClip) {
    const QString movie = mobile.filePath("large.mp4");
    ASSERT_TRUE(writeLargeRecording(movie, recording(), 160 << 20));
    QProcess host;
    start(host, "wait ready\ntap saveButton\nsleep 60\n", movie);
    qint64 extension = 0;
    ASSERT_TRUE(pollUntil([&] { return (extension = childOf(host.processId())) != 0; }, 20000));
    // The untrimmed save tells the host first, then writes to the album.
    QByteArray out;
    while (!out.contains(kSavedToAlbumReport) && host.waitForReadyRead(30000))
        out += host.readAllStandardOutput();
    ASSERT_TRUE(out.contains(kSavedToAlbumReport)) << out.toStdString();
    ::kill(pid_t(extension), SIGKILL);
    ASSERT_TRUE(host.waitForFinished(30000));
    EXPECT_EQ(host.exitCode(), 1);
    EXPECT_TRUE(host.readAllStandardError().contains("the editor ended abnormally"));
    for (const QString& name : albumFiles())
        EXPECT_EQ(hashOf(album.filePath(name)), hashOf(movie)) << "partial: " << name.toStdString();
}

TEST_F(Faults, ALargeUntrimmedSaveAcrossFileSystemsArrivesWhole) {
    // The recording on another file system than the album's (shared memory
    // and the temporary folder), so the album copies every byte.
    QString base = "/dev/shm";
    const qint64 size = 48 << 20;
    const QStorageInfo shm(base);
    const QStorageInfo albumVolume(album.path());
    if (!shm.isValid() || shm.bytesAvailable() < 2 * size || shm.device() == albumVolume.device())
        base = QDir::tempPath(); // then at least the copy is a large one
    QTemporaryDir source(base + "/tamsel-large-XXXXXX");
    ASSERT_TRUE(source.isValid());
    const QString movie = source.filePath("large.mp4");
    ASSERT_TRUE(writeLargeRecording(movie, recording(), size));
    const Run run = edit("wait ready\ntap saveButton\n", movie);
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    EXPECT_EQ(run.hostReport, kSavedToAlbumReport);
    ASSERT_EQ(albumFiles(), QStringList{"large.mp4"})
        << "the album write finishes before the process ends";
    EXPECT_EQ(hashOf(album.filePath("large.mp4")), hashOf(movie));
}
