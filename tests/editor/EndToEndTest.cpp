// The product as a host uses it: tamsel-edit, the extension process, the
// editor driven by automation, the album and the temporary directory. The
// typical use by pointer is RepeatedUse's.

#include "EndToEndFixture.h"
#include "MediaGenerator.h"
#include "platform/media/Asset.h"

#include <QJsonArray>
#include <QSet>
#include <QUrl>
#include <algorithm>

namespace {

QStringList names(const QJsonValue& array) {
    QStringList out;
    for (const QJsonValue& v : array.toArray())
        out.append(v.toString());
    return out;
}

} // namespace

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
    // The trim button's save: from the start handle for the end handle's time.
    ASSERT_EQ(albumFiles().size(), 1);
    expectWholeClipsOnly(trimming["editEndTime"].toDouble());

    // Tab goes round the controls the user sees, and only those: the
    // editor the principal built before its inputs came lies beneath.
    QSet<QString> reached, expected{"avTrimmer"};
    for (int i = 2; i < run.dumps.size(); ++i)
        reached.insert(run.dumps[i]["focus"].toString());
    for (const QString& item : names(saved["topToolBar"]))
        if (!item.endsWith("Space") && item != "titleButton")
            expected.insert(item);
    EXPECT_EQ(reached, expected) << QStringList(reached.values()).join(", ").toStdString();
}

TEST_F(EndToEnd, AFailingCommandSaysWhyAndFails) {
    // Else a broken script would pass for a working one.
    for (const char* script : {"wait ready\ntap noSuchButton\n", "wait playing 0.5\n"}) {
        const Run run = edit(script);
        EXPECT_NE(run.exitCode, 0) << script;
        EXPECT_TRUE(run.err.contains("automation: line")) << script << run.err.toStdString();
    }
}

// A GNOME-style recording (VP8 and Vorbis in WebM), trimmed and saved three
// times in a row: each save exports from the clip the previous one left in
// the player (whose file the editor removed first), and each lands in the
// album as an MP4 that starts where the handles said.
TEST_F(EndToEnd, TrimmingASavedClipAgainSavesAgainAsOftenAsAsked) {
    const QString webm = dir->filePath("gnome-recording.webm");
    QString error;
    ASSERT_TRUE(testmedia::writeMovie(webm,
                                      {.seconds = 8,
                                       .container = testmedia::Container::WebM,
                                       .videoCodec = testmedia::VideoCodec::VP8,
                                       .audioCodec = testmedia::AudioCodec::Vorbis},
                                      &error))
        << error.toStdString();
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
