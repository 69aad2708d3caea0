// The product as a host uses it: tamsel-edit, the extension process, the
// editor driven by automation, the album and the temporary directory.

#include "EndToEndFixture.h"
#include "MediaGenerator.h"
#include "platform/media/Asset.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>
#include <QImage>
#include <QJsonArray>
#include <QProcess>
#include <QSet>
#include <QStandardPaths>
#include <QThread>
#include <QUrl>
#include <algorithm>
#include <csignal>

namespace {

QStringList names(const QJsonValue& array) {
    QStringList out;
    for (const QJsonValue& v : array.toArray())
        out.append(v.toString());
    return out;
}

const QString kSaved = QStringLiteral("[\"org.tamsel.activity.SaveToAlbum\"]");

} // namespace

TEST_F(EndToEnd, TheTypicalUse) {
    const QByteArray original = hashOf(recording());
    const Run run = edit(R"(
wait ready
dump
tap videoOverlayPlayButton
wait playing
wait paused 60
dump
drag end 4
dump
tap playButton
wait playing
wait paused 30
dump
tap videoOverlay
sleep 0.3
tap trimButton
wait exporting=false 60
dump
tap doneButton
)");
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    ASSERT_EQ(run.dumps.size(), 5) << run.out.toStdString();

    const QJsonObject intro = run.dumps[0];
    EXPECT_TRUE(intro["introMode"].toBool());
    EXPECT_FALSE(intro["hasEdit"].toBool());
    EXPECT_DOUBLE_EQ(intro["editStartTime"].toDouble(), 0.0);
    EXPECT_NEAR(intro["editEndTime"].toDouble(), 10.0, 0.1);

    const QJsonObject ended = run.dumps[1];
    EXPECT_FALSE(ended["introMode"].toBool()) << "the first play ends intro mode";
    EXPECT_FALSE(ended["uiHidden"].toBool()) << "the chrome comes back at the end";
    EXPECT_NEAR(ended["currentTime"].toDouble(), 0.0, 0.05) << "and the playhead goes back to zero";

    const QJsonObject trimming = run.dumps[2];
    EXPECT_TRUE(trimming["trimming"].toBool());
    EXPECT_TRUE(trimming["hasEdit"].toBool());
    EXPECT_NEAR(trimming["editEndTime"].toDouble(), 4.0, 0.1);
    EXPECT_TRUE(names(trimming["topToolBar"]).contains("trimButton"));
    EXPECT_FALSE(names(trimming["topToolBar"]).contains("saveButton"));

    const QJsonObject playedRange = run.dumps[3];
    EXPECT_NEAR(playedRange["currentTime"].toDouble(), trimming["editEndTime"].toDouble(), 0.2)
        << "the range plays from the start handle and stops at the end handle";

    const QJsonObject saved = run.dumps[4];
    EXPECT_FALSE(saved["exporting"].toBool());
    EXPECT_FALSE(saved["trimming"].toBool()) << "the player switched to the trimmed clip";
    EXPECT_TRUE(
        saved["videoURL"].toString().startsWith("/private/var/mobile/Library/Tamsel//Racer_"));
    EXPECT_TRUE(names(saved["topToolBar"]).contains("doneButton"));

    EXPECT_EQ(run.hostReport, kSaved.toUtf8());
    EXPECT_EQ(hashOf(recording()), original) << "the host's movie is never modified";
    EXPECT_TRUE(tempFiles().isEmpty()) << tempFiles().join(", ").toStdString();

    ASSERT_EQ(albumFiles().size(), 1);
    const auto clip =
        platform::Asset::assetWithURL(QUrl::fromLocalFile(album.filePath(albumFiles().first())));
    ASSERT_TRUE(clip->isPlayable());
    EXPECT_NEAR(clip->duration().seconds(), trimming["editEndTime"].toDouble(), 0.1);
}

TEST_F(EndToEnd, AnUntrimmedSaveTellsTheHostAndPutsTheRecordingInTheAlbum) {
    const Run run = edit("wait ready\ntap saveButton\n");
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    EXPECT_EQ(run.hostReport, kSaved.toUtf8());
    ASSERT_EQ(albumFiles(), QStringList{"recording.mp4"})
        << "the album write finishes before the process ends";
    EXPECT_EQ(hashOf(album.filePath("recording.mp4")), hashOf(recording()));
}

TEST_F(EndToEnd, AFileThatIsNotAMovieStillGetsAnEditorThatEndsCleanly) {
    const QString notAMovie = mobile.filePath("notes.mp4");
    QFile file(notAMovie);
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write("plain text, not a movie");
    file.close();

    const Run run =
        edit("wait log \"loaded input items\"\nsleep 0.5\ndump\ntap cancelButton\n", notAMovie);
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    ASSERT_EQ(run.dumps.size(), 1);
    EXPECT_TRUE(run.dumps[0]["introMode"].toBool());
    EXPECT_EQ(run.hostReport, "[]");
    EXPECT_TRUE(albumFiles().isEmpty());
}

TEST_F(EndToEnd, ShakeUndoesATrimAndCancelThenReadsDone) {
    const Run run = edit("wait ready\ndrag start 2\ndump\nshake\ndump\ntap doneButton\n");
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    ASSERT_EQ(run.dumps.size(), 2);
    EXPECT_TRUE(run.dumps[0]["trimming"].toBool());
    EXPECT_NEAR(run.dumps[0]["editStartTime"].toDouble(), 2.0, 0.1);
    EXPECT_FALSE(run.dumps[1]["trimming"].toBool());
    EXPECT_NEAR(run.dumps[1]["editStartTime"].toDouble(), 2.0, 0.1) << "cancelling keeps the range";
    EXPECT_EQ(names(run.dumps[1]["topToolBar"]).first(), "doneButton");
    EXPECT_EQ(run.hostReport, "[]");
}

TEST_F(EndToEnd, TheKeyboardAlonePlaysTrimsSavesAndReachesEveryControl) {
    QString script = R"(
wait ready
key Space         # the overlay play button
wait playing
key Space         # pause; the chrome comes back
wait paused
key Home
key Shift+Right
key Shift+Right
key I
key Shift+Right
key Shift+Right
key Shift+Right
key O
dump
key Ctrl+S
wait exporting=false 60
dump
)";
    for (int i = 0; i < 12; ++i)
        script += "key Tab\ndump\n";
    const Run run = edit(script);
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    ASSERT_EQ(run.dumps.size(), 14) << run.out.toStdString();

    const QJsonObject trimming = run.dumps[0];
    EXPECT_TRUE(trimming["trimming"].toBool());
    EXPECT_FALSE(trimming["introMode"].toBool());
    EXPECT_NEAR(trimming["editStartTime"].toDouble(), 2.0, 1e-6);
    EXPECT_NEAR(trimming["editEndTime"].toDouble(), 5.0, 1e-6);

    const QJsonObject saved = run.dumps[1];
    EXPECT_FALSE(saved["trimming"].toBool()) << "the player switched to the trimmed clip";
    EXPECT_TRUE(
        saved["videoURL"].toString().startsWith("/private/var/mobile/Library/Tamsel//Racer_"));
    EXPECT_TRUE(names(saved["activityTypes"]).contains("org.tamsel.activity.SaveToAlbum"));
    ASSERT_EQ(albumFiles().size(), 1);
    const auto clip =
        platform::Asset::assetWithURL(QUrl::fromLocalFile(album.filePath(albumFiles().first())));
    // The trim button's save: from the start handle for the end handle's time.
    EXPECT_NEAR(clip->duration().seconds(), trimming["editEndTime"].toDouble(), 0.1);

    // Tab goes round the controls the user sees, and only those: the
    // editor the principal built before its inputs came lies beneath.
    QSet<QString> reached;
    for (int i = 2; i < run.dumps.size(); ++i)
        reached.insert(run.dumps[i]["focus"].toString());
    QSet<QString> expected{"avTrimmer"};
    for (const QString& item : names(saved["topToolBar"]))
        if (!item.endsWith("Space") && item != "titleButton")
            expected.insert(item);
    QStringList reachedList = reached.values(), expectedList = expected.values();
    reachedList.sort();
    expectedList.sort();
    EXPECT_EQ(reachedList.join(", ").toStdString(), expectedList.join(", ").toStdString());
}

TEST_F(EndToEnd, APhoneFollowsTheWindowsShape) {
    const Run run = edit(
        "wait ready\nresize 400 700\nsleep 0.6\ndump\nresize 900 500\nsleep 0.6\ndump\ndismiss\n",
        QString(), {"--device", "phone"});
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    ASSERT_EQ(run.dumps.size(), 2);
    EXPECT_FALSE(run.dumps[0]["padMode"].toBool());
    EXPECT_EQ(names(run.dumps[0]["bottomToolBar"]), (QStringList{"shareButton", "flexSpace"}));
    EXPECT_TRUE(run.dumps[1]["padMode"].toBool()) << "a phone on its side gets the wide layout";
    EXPECT_TRUE(run.dumps[1]["bottomToolBar"].toArray().isEmpty());
    EXPECT_EQ(run.hostReport, "[]") << "dismissed with nothing done";
}

TEST_F(EndToEnd, AFailingCommandSaysWhyAndFails) {
    for (const char* script : {"wait ready\ntap noSuchButton\n", "wait ready\ntap trimButton\n",
                               "wait playing 0.5\n", "frobnicate\n"}) {
        const Run run = edit(script);
        EXPECT_NE(run.exitCode, 0) << script;
        EXPECT_TRUE(run.err.contains("automation: line")) << script << run.err.toStdString();
    }
}

TEST_F(EndToEnd, ScreenshotsOfIntroAndEditModeUnderXvfb) {
    const QString xvfbRun = QStandardPaths::findExecutable("xvfb-run");
    if (xvfbRun.isEmpty())
        GTEST_SKIP() << "xvfb-run is not installed";
    const QString shots = QCoreApplication::applicationDirPath() + "/../screenshots";
    QDir().mkpath(shots);
    const QString intro = shots + "/editor-intro.png", editing = shots + "/editor-edit.png";
    QFile::remove(intro);
    QFile::remove(editing);

    // tamsel-edit itself runs inside a fresh X server.
    const QString script =
        QString("wait ready\nsleep 0.5\nscreenshot %1\ndrag end 5\nsleep 0.8\nscreenshot %2\n")
            .arg(intro, editing);
    QFile file(mobile.filePath("shots.txt"));
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write(script.toUtf8());
    file.close();
    QProcess process;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.remove("QT_QPA_PLATFORM");
    environment.insert("TAMSEL_MOBILE_ROOT", mobile.path());
    environment.insert("TAMSEL_ALBUM_DIR", album.path());
    environment.insert("TAMSEL_AUDIO", "null");
    process.setProcessEnvironment(environment);
    process.start(xvfbRun, {"-a", "-s", "-screen 0 1280x800x24",
                            QCoreApplication::applicationDirPath() + "/tamsel-edit", recording(),
                            "--app-name", "Racer", "--automation", file.fileName()});
    ASSERT_TRUE(process.waitForFinished(120000));
    ASSERT_EQ(process.exitCode(), 0) << process.readAllStandardError().toStdString();

    for (const QString& path : {intro, editing}) {
        const QImage shot(path);
        ASSERT_FALSE(shot.isNull()) << path.toStdString();
        QSet<QRgb> colours;
        for (int y = 0; y < shot.height(); y += 7)
            for (int x = 0; x < shot.width(); x += 7)
                colours.insert(shot.pixel(x, y));
        EXPECT_GT(colours.size(), 50) << path.toStdString() << " looks blank";
    }
}

namespace {

// The pid of a child process of `parent`, or 0.
qint64 childOf(qint64 parent) {
    QFile children(QString("/proc/%1/task/%1/children").arg(parent));
    if (!children.open(QIODevice::ReadOnly))
        return 0;
    return children.readAll().trimmed().split(' ').first().toLongLong();
}

// Whether the process is gone (or only a zombie waiting to be reaped).
bool ended(qint64 pid) {
    QFile status(QString("/proc/%1/status").arg(pid));
    if (!status.open(QIODevice::ReadOnly))
        return true;
    return status.readAll().contains("State:\tZ");
}

} // namespace

TEST_F(EndToEnd, TheEditorEndsWhenItsHostGoesAway) {
    QFile script(mobile.filePath("idle.txt"));
    ASSERT_TRUE(script.open(QIODevice::WriteOnly));
    script.write("wait ready\nsleep 60\n");
    script.close();
    QProcess host;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert("TAMSEL_MOBILE_ROOT", mobile.path());
    environment.insert("TAMSEL_AUDIO", "null");
    environment.insert("QT_QPA_PLATFORM", "offscreen");
    host.setProcessEnvironment(environment);
    host.start(QCoreApplication::applicationDirPath() + "/tamsel-edit",
               {recording(), "--automation", script.fileName()});
    ASSERT_TRUE(host.waitForStarted());
    qint64 extension = 0;
    for (int i = 0; i < 200 && !extension; ++i) {
        QThread::msleep(50);
        extension = childOf(host.processId());
    }
    ASSERT_NE(extension, 0) << "the host started no extension";
    QThread::msleep(500);
    host.kill(); // no chance to say goodbye
    host.waitForFinished();
    bool gone = false;
    for (int i = 0; i < 200 && !gone; ++i) {
        QThread::msleep(50);
        gone = ended(extension);
    }
    EXPECT_TRUE(gone) << "the extension outlived its host";
    if (!gone)
        ::kill(pid_t(extension), SIGKILL);
}

// A GNOME-style recording (VP8 and Vorbis in WebM), trimmed and saved three
// times in a row: each save exports from the clip the previous one left in
// the player (whose file the editor removed first), and each lands in the
// album as an MP4 that starts where the handles said.
TEST_F(EndToEnd, TrimmingASavedClipAgainSavesAgainAsOftenAsAsked) {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 8;
    movieSpec.container = testmedia::Container::WebM;
    movieSpec.videoCodec = testmedia::VideoCodec::VP8;
    movieSpec.audioCodec = testmedia::AudioCodec::Vorbis;
    const QString webm = dir->filePath("gnome-recording.webm");
    QString error;
    ASSERT_TRUE(testmedia::writeMovie(webm, movieSpec, &error)) << error.toStdString();
    const QByteArray original = hashOf(webm);
    const Run run = edit(R"(
wait ready
drag end 6
tap trimButton
wait exporting=false 60
wait ready
drag end 4
tap trimButton
wait exporting=false 60
wait ready
drag end 2
tap trimButton
wait exporting=false 60
wait ready
dump
tap doneButton
)",
                         webm);
    ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
    ASSERT_EQ(run.dumps.size(), 1) << run.out.toStdString();
    EXPECT_FALSE(run.dumps[0]["exporting"].toBool());
    EXPECT_NEAR(run.dumps[0]["editEndTime"].toDouble(), 2.0, 0.1);
    EXPECT_EQ(hashOf(webm), original);
    EXPECT_TRUE(tempFiles().isEmpty()) << tempFiles().join(", ").toStdString();
    QStringList clips = albumFiles();
    ASSERT_EQ(clips.size(), 3) << clips.join(", ").toStdString();
    QList<double> lengths;
    for (const QString& clip : clips) {
        EXPECT_TRUE(clip.endsWith(".mp4"));
        lengths.append(platform::Asset::assetWithURL(QUrl::fromLocalFile(album.filePath(clip)))
                           ->duration()
                           .seconds());
    }
    std::sort(lengths.begin(), lengths.end());
    EXPECT_NEAR(lengths[0], 2.0, 0.1);
    EXPECT_NEAR(lengths[1], 4.0, 0.1);
    EXPECT_NEAR(lengths[2], 6.0, 0.1);
}
