// What a host may send that it should not: application names that are paths,
// a movie behind a symbolic link, an attachment that is not there. Every file
// the editor writes or removes stays in the temporary store and the album,
// and the clip is saved all the same.

#include "EndToEndFixture.h"

#include <QDir>
#include <QFile>
#include <sys/stat.h>

namespace {

const char* kTrimmedSave = R"(
wait ready
drag end 3
tap trimButton
wait exporting=false 60
tap doneButton
)";

} // namespace

using HostileInput = EndToEnd;

TEST_F(HostileInput, ApplicationNamesThatArePathsStayInTheStoreAndStillSave) {
    QTemporaryDir outside; // where a name's ".." steps would lead
    const QString store = mobile.filePath("Library/Tamsel");
    ASSERT_TRUE(QDir().mkpath(store));
    const QString climb = QDir(store).relativeFilePath(outside.filePath("evil"));
    ASSERT_TRUE(climb.startsWith("../"));
    const QStringList names = {"AC/DC", climb, "...", QString(4096, 'x'), "/", "a/../../b"};
    for (const QString& name : names) {
        const std::string context = name.left(40).toStdString();
        const Run run = edit(kTrimmedSave, {}, {"--app-name", name});
        ASSERT_EQ(run.exitCode, 0) << context << "\n" << run.err.toStdString();
        EXPECT_EQ(run.hostReport, kSavedToAlbumReport) << context;
        EXPECT_TRUE(
            QDir(outside.path()).isEmpty(QDir::AllEntries | QDir::Hidden | QDir::NoDotAndDotDot))
            << context;
        EXPECT_EQ(albumFiles().size(), 1) << context;
        expectWholeClipsOnly(3.0);
        EXPECT_TRUE(tempFiles().isEmpty())
            << context << ": " << tempFiles().join(", ").toStdString();
        // Nothing beside the store either: only its own folder is in Library.
        EXPECT_EQ(QDir(mobile.filePath("Library"))
                      .entryList(QDir::AllEntries | QDir::NoDotAndDotDot | QDir::Hidden),
                  QStringList{"Tamsel"})
            << context;
        for (const QString& file : albumFiles())
            QFile::remove(album.filePath(file));
    }
}

TEST_F(HostileInput, AMovieBehindALinkAndAnAttachmentThatIsNotThere) {
    // The recording sits in a folder the editor has no business writing to;
    // the host names it through a symbolic link.
    QTemporaryDir elsewhere;
    const QString readOnly = elsewhere.filePath("recordings");
    ASSERT_TRUE(QDir().mkpath(readOnly));
    ASSERT_TRUE(QFile::copy(recording(), readOnly + "/recording.mp4"));
    QFile::setPermissions(readOnly, QFileDevice::ReadOwner | QFileDevice::ExeOwner);
    const QString link = elsewhere.filePath("link.mp4");
    ASSERT_TRUE(QFile::link(readOnly + "/recording.mp4", link));
    const QByteArray original = hashOf(readOnly + "/recording.mp4");

    const Run run = edit(QString(kTrimmedSave).replace("tap doneButton", R"(tap shareButton
share cancel
tap doneButton)"),
                         link, {"--attachment", elsewhere.filePath("no/such/file.mov")});
    QFile::setPermissions(readOnly,
                          QFileDevice::ReadOwner | QFileDevice::WriteOwner | QFileDevice::ExeOwner);
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    EXPECT_EQ(run.hostReport, kSavedToAlbumReport);
    EXPECT_EQ(hashOf(readOnly + "/recording.mp4"), original)
        << "the host's movie is never modified";
    EXPECT_EQ(QDir(readOnly).entryList(QDir::AllEntries | QDir::NoDotAndDotDot | QDir::Hidden),
              QStringList{"recording.mp4"});
    EXPECT_EQ(albumFiles().size(), 1);
    expectWholeClipsOnly(3.0);
    EXPECT_TRUE(tempFiles().isEmpty());
}

// Handed a named pipe, the editor once opened it on the main thread and
// waited for good, window and host with it; a file that is not a movie at
// all still gets an editor, in intro mode, that ends when cancelled.
TEST_F(HostileInput, APipeOrAFileThatIsNotAMovieGetsAnEditorThatStillEnds) {
    const QString fifo = mobile.filePath("recording.mp4");
    ASSERT_EQ(::mkfifo(QFile::encodeName(fifo).constData(), 0600), 0);
    QFile text(mobile.filePath("notes.mp4"));
    ASSERT_TRUE(text.open(QIODevice::WriteOnly));
    text.write("plain text, not a movie");
    text.close();
    for (const auto& [movie, line] : {std::pair{fifo, "not a regular file"},
                                      std::pair{text.fileName(), "loaded input items"}}) {
        const Run run = edit(
            QString("wait log \"%1\" 20\nsleep 0.5\ndump\ntap cancelButton\n").arg(line), movie);
        ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
        ASSERT_EQ(run.dumps.size(), 1);
        EXPECT_TRUE(run.dumps[0]["introMode"].toBool());
        EXPECT_EQ(run.hostReport, "[]");
        EXPECT_TRUE(albumFiles().isEmpty());
    }
}
