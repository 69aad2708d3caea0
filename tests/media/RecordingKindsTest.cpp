// Every kind of recording that Linux screen recorders write, through the
// media services the editor uses: the asset, the thumbnails and the
// pass-through save, on short clips that the tests generate.

#include "ExportChecks.h"
#include "MediaFixtures.h"
#include "platform/media/Asset.h"
#include "platform/media/ImageGenerator.h"

#include "support/TempDir.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QProcess>
#include <gtest/gtest.h>

using namespace platform;
using namespace mediatest;
using testing_support::hashOf;
using testmedia::AudioCodec;
using testmedia::Container;
using testmedia::MovieSpec;
using testmedia::VideoCodec;

namespace {

struct Kind {
    const char* name;
    MovieSpec movie;
    // Ranges (start, duration) that start between keyframes, as the user's
    // handles do.
    std::vector<std::pair<double, double>> ranges = {{1.3, 1.5}};
    // Through the remuxer as well as the span copy, which takes plain MP4.
    bool remuxToo = false;
};

using C = Container;
using V = VideoCodec;
using A = AudioCodec;

std::vector<Kind> kinds() {
    return {
        // On a keyframe, from the first frame, a short range late on.
        {"Mp4",
         {.seconds = 6, .keyframeInterval = 60},
         {{1.5, 2.0}, {2.0, 1.9}, {0.0, 2.5}, {3.8, 0.5}},
         true},
        // The clip's audio track starts with a gap.
        {"Mp4AudioStartsLate", {.seconds = 4, .audioStart = 0.5}, {{0.0, 2.5}, {0.2, 2.5}}, true},
        // As the editor asks after moving the start handle: duration = end handle.
        {"Mp4RangeRunsPastTheEnd", {.seconds = 3}, {{1.0, 3.0}}, true},
        {"Mp4TurnedReordered",
         {.seconds = 4, .rotationDegrees = 90, .keyframeInterval = 45, .bFrames = 2},
         {{1.2, 1.5}},
         true},
        {"WebmVp8Vorbis",
         {.seconds = 3, .container = C::WebM, .videoCodec = V::VP8, .audioCodec = A::Vorbis}},
        {"WebmVp9Opus",
         {.seconds = 3, .container = C::WebM, .videoCodec = V::VP9, .audioCodec = A::Opus}},
        {"MatroskaH264AacReordered", {.seconds = 3, .bFrames = 2, .container = C::Matroska}},
        {"FragmentedMp4Reordered", {.seconds = 3, .bFrames = 2, .container = C::FragmentedMp4}},
        {"FragmentedMp4WithSegmentIndex",
         {.seconds = 3, .bFrames = 2, .container = C::FragmentedMp4, .segmentIndex = true}},
        {"FragmentedMp4", {.seconds = 3, .container = C::FragmentedMp4}},
        {"H264FullChroma", {.width = 321, .height = 241, .seconds = 3, .videoCodec = V::H264_444}},
        {"Hevc", {.seconds = 3, .bFrames = 2, .videoCodec = V::HEVC}},
        {"NoAudio", {.seconds = 3, .audio = false}},
        {"TwoAudioTracks", {.seconds = 3, .audioTracks = 2}},
        {"VariableFrameRate", {.seconds = 3, .variableFrameRate = true}},
        {"TimestampsStartLateMp4", {.seconds = 3, .startSeconds = 3.5}},
        {"TimestampsStartLateMatroska",
         {.seconds = 3, .container = C::Matroska, .startSeconds = 12.25}},
        {"OddSizeVp8",
         {.width = 321,
          .height = 239,
          .seconds = 3,
          .container = C::WebM,
          .videoCodec = V::VP8,
          .audioCodec = A::Opus}},
    };
}

void PrintTo(const Kind& kind, std::ostream* os) {
    *os << kind.name;
}

class RecordingKind : public testing::TestWithParam<Kind> {};

// The strip's thumbnails: the keyframe at or before each time of the movie
// (the generator's default tolerance), the frames' own pictures, at their
// own times.
void expectStrip(const std::shared_ptr<Asset>& asset, const MovieSpec& movieSpec,
                 std::initializer_list<double> times = {0.0, 1.3, 2.6}) {
    const ClipInfo original = probeClip(asset->url().toLocalFile());
    auto generator = ImageGenerator::imageGeneratorWithAsset(asset);
    generator->setMaximumSize(QSizeF(96, 72));
    for (double t : times) {
        const ShownFrame* keyframe = &original.frames.front();
        for (const ShownFrame& f : original.frames)
            if (f.seconds - original.startTime <= t + 1e-6 &&
                f.index % movieSpec.keyframeInterval == 0 && f.index > keyframe->index)
                keyframe = &f;
        MediaTime actual;
        ErrorPtr error;
        const QImage image = generator->copyImageAtTime_actualTime_error(
            MediaTime::fromSeconds(t, 600), &actual, &error);
        ASSERT_FALSE(image.isNull())
            << t << ": " << (error ? error->description().toStdString() : "");
        EXPECT_EQ(testmedia::readFrameIndex(image), keyframe->index) << "at " << t;
        EXPECT_NEAR(actual.seconds(), keyframe->seconds - original.startTime, 1e-3) << "at " << t;
    }
}

} // namespace

// Each range saved, and the saved clip cut again (the editor plays the clip
// it saved, so the next trim cuts a clip with a hidden lead of its own).
TEST_P(RecordingKind, OpensFillsTheStripAndSavesTheRequestedRange) {
    const Kind& kind = GetParam();
    const QString source = movieFor(kind.movie);
    const QByteArray before = hashOf(source);
    const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(source));
    ASSERT_FALSE(asset->error()) << asset->error()->description().toStdString();
    ASSERT_EQ(asset->tracksWithMediaType(MediaType::Video).size(), 1);
    EXPECT_EQ(asset->tracksWithMediaType(MediaType::Audio).size(),
              kind.movie.audio ? kind.movie.audioTracks : 0);
    EXPECT_NEAR(asset->duration().seconds(), kind.movie.seconds, 0.1);
    expectStrip(asset, kind.movie);

    for (const char* remux : {"", "1"}) {
        if (*remux && !kind.remuxToo)
            continue;
        testing_support::ScopedEnv env("TAMSEL_EXPORT_REMUX", remux);
        for (const auto& [start, duration] : kind.ranges) {
            SCOPED_TRACE(testing::Message() << "remux '" << remux << "' from " << start);
            const QString output = scratchPath(QStringLiteral("clip.mp4"));
            ExportRun run{makeSession(source, output, start, duration)};
            ASSERT_TRUE(completes(run));
            EXPECT_EQ(run.completions, 1);
            EXPECT_NE(run.completionThread, std::this_thread::get_id());
            EXPECT_EQ(run.session->progress(), 1.0f);
            expectFaithfulCut(kind.movie, source, output, start, duration);

            const QString again = scratchPath(QStringLiteral("again.mp4"));
            ASSERT_TRUE(completes(makeSession(output, again, 0.3, 0.6)));
            expectFaithfulCut(kind.movie, output, again, 0.3, 0.6);
        }
    }
    EXPECT_EQ(hashOf(source), before);
}

INSTANTIATE_TEST_SUITE_P(Recordings, RecordingKind, testing::ValuesIn(kinds()),
                         [](const testing::TestParamInfo<Kind>& info) {
                             return std::string(info.param.name);
                         });

// A recorder killed mid-way leaves a fragmented MP4 ending inside a fragment,
// or a Matroska file (written live: no duration, no cues) ending inside a
// cluster. What was completely written opens, fills the strip and saves; the
// recording is never written to.
TEST(CutShortRecording, OpensWithWhatWasCompletelyWrittenAndSaves) {
    for (const MovieSpec& movieSpec :
         {MovieSpec{.seconds = 6, .truncated = true, .bFrames = 2, .container = C::FragmentedMp4},
          MovieSpec{.seconds = 6,
          .truncated = true,
          .container = C::WebM,
          .videoCodec = V::VP8,
          .audioCodec = A::Vorbis}}) {
        const QString source = movieFor(movieSpec);
        SCOPED_TRACE(source.toStdString());
        const QByteArray before = hashOf(source);
        // What a decoder gets out of the file before it runs dry.
        const ClipInfo written = probeClip(source);
        ASSERT_GT(written.frames.size(), 30u);
        const double lastFrame = written.frames.back().seconds - written.startTime;

        const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(source));
        ASSERT_FALSE(asset->error());
        const double duration = asset->duration().seconds();
        // Complete fragments hold whole keyframe intervals; a Matroska file
        // keeps every complete block.
        EXPECT_GT(duration, 1.0);
        EXPECT_LT(duration, movieSpec.seconds * 0.8);
        EXPECT_LE(duration,
                  std::max(lastFrame + 1.0 / movieSpec.fps, written.audioEnd - written.startTime) +
                      1e-3);
        expectStrip(asset, movieSpec, {0.0, duration / 2, duration - 0.01});

        const QString output = scratchPath(QStringLiteral("rescued.mp4"));
        ASSERT_TRUE(completes(makeSession(source, output, 0.7, duration)));
        expectFaithfulCut(movieSpec, source, output, 0.7, duration - 0.7);
        EXPECT_EQ(hashOf(source), before);
    }
}

// Users name their recordings as they like; nothing is quoted by a shell or
// read as a URL, so quotes, spaces and non-ASCII letters change nothing.
TEST(RecordingNames, QuotesSpacesAndNonAsciiLettersAreJustNames) {
    const MovieSpec movieSpec{
        .seconds = 3, .container = C::WebM, .videoCodec = V::VP9, .audioCodec = A::Opus};
    const QString folder = scratchPath(QStringLiteral("Bildschirmaufnahmen 'écran' \"録画\""));
    ASSERT_TRUE(QDir().mkpath(folder));
    const QString source = folder + QStringLiteral("/It's a \"test\" – ünïcode #1 ?.webm");
    ASSERT_TRUE(QFile::copy(movieFor(movieSpec), source));
    expectStrip(Asset::assetWithURL(QUrl::fromLocalFile(source)), movieSpec, {0.0, 1.3});
    const QString output = folder + QStringLiteral("/Racer's \"clip\" 100% é_1700000000.mp4");
    ASSERT_TRUE(completes(makeSession(source, output, 1.3, 1.0)));
    expectFaithfulCut(movieSpec, source, output, 1.3, 1.0);
}

// Two hours at one frame a second, big frames: saving all of it takes no
// more memory than saving a minute (each export in a process of its own,
// the test's export tool, which prints its peak memory; both ways of
// copying).
TEST(LongRecording, SavesHoursWithFlatMemory) {
    // Large frames, so holding them would show.
    const MovieSpec movieSpec{
        .fps = 1, .seconds = 2 * 3600, .audio = false, .keyframeInterval = 60, .crf = 4};
    const QString source = movieFor(movieSpec);
    ASSERT_GT(QFileInfo(source).size(), 40ll << 20);
    EXPECT_NEAR(Asset::assetWithURL(QUrl::fromLocalFile(source))->duration().seconds(), 7200, 1);

    const auto peakKb = [&](const QString& output, double start, double duration) {
        QProcess tool;
        tool.start(TAMSEL_TEST_EXPORT_TOOL,
                   {source, output, QString::number(start), QString::number(duration)});
        const bool finished = tool.waitForFinished(600000);
        EXPECT_TRUE(finished && tool.exitCode() == 0) << tool.readAllStandardError().toStdString();
        return tool.readAllStandardOutput().trimmed().toLong();
    };
    for (const char* remux : {"1", ""}) {
        testing_support::ScopedEnv env("TAMSEL_EXPORT_REMUX", remux);
        SCOPED_TRACE(testing::Message() << "remux '" << remux << "'");
        const QString minute = scratchPath(QStringLiteral("minute.mp4"));
        const QString hours = scratchPath(QStringLiteral("hours.mp4"));
        const long small = peakKb(minute, 5000.5, 60);
        const long large = peakKb(hours, 100.5, 7000);
        ASSERT_GT(small, 0);
        EXPECT_LT(large - small, 8 * 1024);
        const ClipInfo clip = probeClip(hours, 3);
        ASSERT_EQ(clip.frames.size(), 3u);
        EXPECT_EQ(clip.frames.front().index, 100);
        EXPECT_EQ(clip.frames[1].index, 101);
        EXPECT_NEAR(clip.videoDuration, 7000 - 0.5, 1.0);
        EXPECT_EQ(probeClip(minute, 1).frames.front().index, 5000);
        QFile::remove(hours);
    }
}
