#include "platform/media/ExportSession.h"
#include "ExportChecks.h"
#include "MediaFixtures.h"
#include "platform/media/Asset.h"
#include "platform/media/ImageGenerator.h"
#include "support/TempDir.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <gtest/gtest.h>

#include <condition_variable>
#include <mutex>
#include <thread>

using namespace platform;
using namespace mediatest;

// Both ways of copying: the span copy (the default for a movie like this)
// and the remuxer it falls back to.
TEST(ExportSessionPassthrough, StartsBetweenKeyframesAtTheRequestedFrameWithAudioInSync) {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 6;
    movieSpec.keyframeInterval = 60;
    const QString source = movieFor(movieSpec);
    for (const char* remux : {"", "1"}) {
        testing_support::ScopedEnv env("TAMSEL_EXPORT_REMUX", remux);
        for (const auto& [start, duration] :
             {std::pair{1.5, 2.0}, std::pair{2.0, 1.9}, std::pair{0.0, 2.5}, std::pair{3.8, 0.5}}) {
            SCOPED_TRACE(testing::Message()
                         << "remux '" << remux << "' start " << start << " duration " << duration);
            const QString output = scratchPath(QStringLiteral("cut.mp4"));
            ExportRun run{makeSession(source, ExportPresetPassthrough, output, start, duration)};
            ASSERT_TRUE(run.runAndWait());
            ASSERT_EQ(run.session->status(), int(ExportSessionStatus::Completed))
                << (run.session->error() ? run.session->error()->description().toStdString() : "");
            EXPECT_EQ(run.completions, 1);
            EXPECT_NE(run.completionThread, std::this_thread::get_id());
            EXPECT_EQ(run.session->progress(), 1.0f);
            EXPECT_FALSE(run.session->error());
            expectFaithfulCut(movieSpec, source, output, start, duration);
            EXPECT_FALSE(leftovers(output));
        }
    }
}

TEST(ExportSessionPassthrough, KeepsRotationAndCopesWithReorderedAndUnevenFrames) {
    testmedia::MovieSpec movieSpec;
    movieSpec.width = 240;
    movieSpec.height = 320;
    movieSpec.rotationDegrees = 90;
    movieSpec.seconds = 4;
    movieSpec.keyframeInterval = 45;
    movieSpec.variableFrameRate = true;
    const QString output = scratchPath(QStringLiteral("portrait.mp4"));
    ExportRun run{makeSession(movieFor(movieSpec), ExportPresetPassthrough, output, 1.2, 1.5)};
    ASSERT_TRUE(run.runAndWait());
    ASSERT_EQ(run.session->status(), int(ExportSessionStatus::Completed));
    const mediatest::ClipInfo clip = probeClip(output);
    EXPECT_EQ(clip.transform, QTransform(0, 1, -1, 0, 320, 0));
    EXPECT_EQ(clip.frames.front().index, frameAt(movieSpec, 1.2));

    movieSpec.bFrames = 2;
    movieSpec.variableFrameRate = false;
    const QString reordered = scratchPath(QStringLiteral("bframes.mp4"));
    ExportRun second{
        makeSession(movieFor(movieSpec), ExportPresetPassthrough, reordered, 1.3, 1.5)};
    ASSERT_TRUE(second.runAndWait());
    ASSERT_EQ(second.session->status(), int(ExportSessionStatus::Completed));
    const mediatest::ClipInfo b = probeClip(reordered);
    ASSERT_FALSE(b.frames.empty());
    EXPECT_EQ(b.frames.front().index, frameAt(movieSpec, 1.3));
    EXPECT_NEAR(b.frames.front().seconds, 0.0, 1e-3);
    // Frames decoded only as references of the last ones are not shown.
    EXPECT_NEAR(b.videoDuration, 1.5, 1.0 / movieSpec.fps);
    EXPECT_EQ(b.frames.back().index, frameAt(movieSpec, 1.3 + 1.5 - 1e-6));
}

// The editor reloads the trimmed clip, so the next trim cuts a clip that
// already has a hidden lead of its own.
TEST(ExportSessionPassthrough, CutsAClipThatWasCutBefore) {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 6;
    movieSpec.keyframeInterval = 60;
    for (const char* remux : {"", "1"}) {
        testing_support::ScopedEnv env("TAMSEL_EXPORT_REMUX", remux);
        SCOPED_TRACE(remux);
        const QString first = scratchPath(QStringLiteral("first.mp4"));
        ExportRun run{makeSession(movieFor(movieSpec), ExportPresetPassthrough, first, 1.5, 3.0)};
        ASSERT_TRUE(run.runAndWait());
        ASSERT_EQ(run.session->status(), int(ExportSessionStatus::Completed));
        const QString second = scratchPath(QStringLiteral("second.mp4"));
        ExportRun again{makeSession(first, ExportPresetPassthrough, second, 0.7, 1.0)};
        ASSERT_TRUE(again.runAndWait());
        ASSERT_EQ(again.session->status(), int(ExportSessionStatus::Completed));
        const mediatest::ClipInfo clip = probeClip(second);
        ASSERT_FALSE(clip.frames.empty());
        EXPECT_EQ(clip.frames.front().index, frameAt(movieSpec, 2.2));
        EXPECT_NEAR(clip.frames.front().seconds, 0.0, 1e-3);
        EXPECT_EQ(clip.frames.back().index, frameAt(movieSpec, 3.2 - 1e-6));
        EXPECT_NEAR(clip.videoDuration, 1.0, 1.0 / movieSpec.fps);
        ASSERT_EQ(clip.burstOnsets.size(), 1u);
        EXPECT_NEAR(clip.burstOnsets[0], 3.0 - 2.2, 0.003);
    }
}

// Audio that begins after the clip does keeps its place: the clip's audio
// track starts with a gap.
TEST(ExportSessionPassthrough, KeepsALateAudioTrackInPlace) {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 4;
    movieSpec.audioStart = 0.5;
    for (const char* remux : {"", "1"}) {
        testing_support::ScopedEnv env("TAMSEL_EXPORT_REMUX", remux);
        for (double start : {0.0, 0.2}) {
            SCOPED_TRACE(testing::Message() << "remux '" << remux << "' start " << start);
            const QString output = scratchPath(QStringLiteral("late-audio.mp4"));
            ExportRun run{
                makeSession(movieFor(movieSpec), ExportPresetPassthrough, output, start, 2.5)};
            ASSERT_TRUE(run.runAndWait());
            ASSERT_EQ(run.session->status(), int(ExportSessionStatus::Completed));
            const mediatest::ClipInfo clip = probeClip(output);
            ASSERT_EQ(clip.burstOnsets.size(), 2u) << testing::PrintToString(clip.burstOnsets);
            EXPECT_NEAR(clip.burstOnsets[0], 1.0 - start, 0.003);
            EXPECT_NEAR(clip.burstOnsets[1], 2.0 - start, 0.003);
            EXPECT_EQ(clip.frames.front().index, frameAt(movieSpec, start));
        }
    }
}

TEST(ExportSessionPassthrough, ClipsARangeRunningPastTheEnd) {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 3;
    const QString output = scratchPath(QStringLiteral("past-end.mp4"));
    // As the editor asks after moving the start handle: start s, duration = end handle.
    ExportRun run{makeSession(movieFor(movieSpec), ExportPresetPassthrough, output, 1.0, 3.0)};
    ASSERT_TRUE(run.runAndWait());
    ASSERT_EQ(run.session->status(), int(ExportSessionStatus::Completed));
    const mediatest::ClipInfo clip = probeClip(output);
    EXPECT_NEAR(clip.videoDuration, 2.0, 1.0 / movieSpec.fps);
    EXPECT_EQ(clip.frames.back().index, testmedia::frameCount(movieSpec) - 1);
}

TEST(ExportSessionFailures, FailCleanlyWithACodeAndLeaveNothing) {
    testmedia::MovieSpec truncated;
    truncated.truncated = true;
    testmedia::MovieSpec good;
    const QString notAMovie = scratchPath(QStringLiteral("notes.mp4"));
    {
        QFile f(notAMovie);
        ASSERT_TRUE(f.open(QIODevice::WriteOnly));
        f.write("this is not a movie\n");
    }
    struct Case {
        const char* name;
        QString source;
        double start, duration;
        QString outputDir;
    };
    const QString missingDir = scratchPath(QStringLiteral("no-such-dir"));
    const Case cases[] = {
        {"truncated recording", movieFor(truncated), 0, 1, {}},
        {"not a movie", notAMovie, 0, 1, {}},
        {"range past the end", movieFor(good), 5, 1, {}},
        {"output folder missing", movieFor(good), 0, 1, missingDir},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        const QString output = c.outputDir.isEmpty() ? scratchPath(QStringLiteral("failed.mp4"))
                                                     : c.outputDir + QStringLiteral("/out.mp4");
        ExportRun run{makeSession(c.source, ExportPresetPassthrough, output, c.start, c.duration)};
        ASSERT_TRUE(run.runAndWait());
        EXPECT_EQ(run.session->status(), int(ExportSessionStatus::Failed));
        ASSERT_TRUE(run.session->error());
        EXPECT_NE(run.session->error()->code(), 0);
        EXPECT_FALSE(QFile::exists(output));
        EXPECT_EQ(run.completions, 1);
    }
    EXPECT_FALSE(ExportSession::exportSessionWithAsset_presetName(
        Asset::assetWithURL(QUrl::fromLocalFile(movieFor(good))),
        QStringLiteral("no-such-preset")));
}

TEST(ExportSessionCancel, LeavesNoFileWhetherCancelledBeforeOrDuring) {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 8;
    const QString source = movieFor(movieSpec);
    for (const QString& preset : {ExportPresetPassthrough, ExportPresetHighestQuality}) {
        SCOPED_TRACE(preset.toStdString());
        const QString output = scratchPath(QStringLiteral("cancelled.mp4"));
        ExportRun early{makeSession(source, preset, output, 0, 8)};
        early.session->cancelExport();
        ASSERT_TRUE(early.runAndWait());
        EXPECT_EQ(early.session->status(), int(ExportSessionStatus::Cancelled));

        ExportRun during{makeSession(source, preset, output, 0, 8)};
        std::mutex m;
        std::condition_variable cv;
        bool done = false;
        during.session->exportAsynchronouslyWithCompletionHandler([&] {
            std::lock_guard lock(m);
            done = true;
            cv.notify_all();
        });
        // Cancel once the writer is under way (or, on a fast machine, has
        // finished: then the export stands and the file is whole).
        while (during.session->status() == int(ExportSessionStatus::Waiting))
            std::this_thread::yield();
        during.session->cancelExport();
        std::unique_lock lock(m);
        ASSERT_TRUE(cv.wait_for(lock, std::chrono::seconds(60), [&] { return done; }));
        if (during.session->status() == int(ExportSessionStatus::Cancelled))
            EXPECT_FALSE(QFile::exists(output));
        else
            EXPECT_EQ(during.session->status(), int(ExportSessionStatus::Completed));
        EXPECT_FALSE(leftovers(output));
    }
}

// A volume other than 1 needs the audio encoded; the video is still copied.
TEST(ExportSessionHighestQuality, EncodesTheAudioAtTheMixVolume) {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 3;
    movieSpec.rotationDegrees = 270;
    const QString source = movieFor(movieSpec);
    const QString output = scratchPath(QStringLiteral("youtube.mp4"));
    auto session = makeSession(source, ExportPresetHighestQuality, output, 0.5, 2.0);
    AudioMix mix;
    for (const AssetTrack& track : session->asset()->tracksWithMediaType(MediaType::Audio)) {
        AudioMixInputParameters p =
            AudioMixInputParameters::audioMixInputParametersWithTrack(track);
        p.volume = 0.25f;
        mix.inputParameters.append(p);
    }
    ASSERT_EQ(mix.inputParameters.size(), 1);
    session->setAudioMix(mix);
    ExportRun run{session};
    ASSERT_TRUE(run.runAndWait(120000));
    ASSERT_EQ(run.session->status(), int(ExportSessionStatus::Completed))
        << (run.session->error() ? run.session->error()->description().toStdString() : "");
    const mediatest::ClipInfo clip = probeClip(output);
    ASSERT_FALSE(clip.frames.empty());
    EXPECT_EQ(clip.frames.front().index, frameAt(movieSpec, 0.5));
    EXPECT_NEAR(clip.frames.front().seconds, 0.0, 1e-3);
    EXPECT_NEAR(clip.videoDuration, 2.0, 1.0 / movieSpec.fps);
    EXPECT_EQ(clip.transform, QTransform(0, -1, 1, 0, 0, 320));
    // The bursts peak at 0.5 in the source; a quarter of that here.
    EXPECT_NEAR(clip.audioPeak, 0.125, 0.03);
    EXPECT_TRUE(videoKeyframes(source).contains(clip.firstVideoPacket));
}

// The editor plays the clip it saved, removes it before the next save and
// exports the next clip from the same asset: the asset keeps reading it.
TEST(ExportSessionPassthrough, ExportsFromAnAssetWhoseFileWasRemoved) {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 3;
    const QString clip = scratchPath(QStringLiteral("saved-clip.mp4"));
    ASSERT_TRUE(QFile::copy(movieFor(movieSpec), clip));
    const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(clip));
    ASSERT_TRUE(QFile::remove(clip));
    for (int round = 1; round <= 3; ++round) {
        SCOPED_TRACE(round);
        const QString output = scratchPath(QStringLiteral("again.mp4"));
        auto session =
            ExportSession::exportSessionWithAsset_presetName(asset, ExportPresetPassthrough);
        session->setOutputURL(QUrl::fromLocalFile(output));
        session->setOutputFileType(FileTypeMPEG4);
        session->setTimeRange(MediaTimeRange::make(MediaTime::fromSeconds(0.5 * round, 600),
                                                   MediaTime::fromSeconds(1.0, 600)));
        ExportRun run{session};
        ASSERT_TRUE(run.runAndWait());
        ASSERT_EQ(run.session->status(), int(ExportSessionStatus::Completed)) << run.why();
        EXPECT_EQ(probeClip(output, 1).frames.front().index, frameAt(movieSpec, 0.5 * round));
    }
    auto generator = ImageGenerator::imageGeneratorWithAsset(asset);
    MediaTime actual;
    EXPECT_FALSE(
        generator
            ->copyImageAtTime_actualTime_error(MediaTime::fromSeconds(1, 600), &actual, nullptr)
            .isNull());
}
