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
#include <gtest/gtest.h>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/wait.h>

using namespace platform;
using namespace mediatest;
using testmedia::AudioCodec;
using testmedia::Container;
using testmedia::MovieSpec;
using testmedia::VideoCodec;

namespace {

struct Kind {
    const char* name;
    MovieSpec movie;
    // A range that starts between keyframes, as the user's handles do.
    double start = 1.3;
    double duration = 1.5;
};

MovieSpec recording(Container container, VideoCodec video, AudioCodec audio) {
    MovieSpec s;
    s.seconds = 3;
    s.keyframeInterval = 30;
    s.container = container;
    s.videoCodec = video;
    s.audioCodec = audio;
    return s;
}

std::vector<Kind> kinds() {
    std::vector<Kind> all;
    all.push_back(
        {"WebmVp8Vorbis", recording(Container::WebM, VideoCodec::VP8, AudioCodec::Vorbis)});
    all.push_back({"WebmVp9Opus", recording(Container::WebM, VideoCodec::VP9, AudioCodec::Opus)});
    MovieSpec mkv = recording(Container::Matroska, VideoCodec::H264, AudioCodec::AAC);
    mkv.bFrames = 2;
    all.push_back({"MatroskaH264AacReordered", mkv});
    MovieSpec fragmented = recording(Container::FragmentedMp4, VideoCodec::H264, AudioCodec::AAC);
    fragmented.bFrames = 2;
    all.push_back({"FragmentedMp4Reordered", fragmented});
    fragmented.segmentIndex = true;
    all.push_back({"FragmentedMp4WithSegmentIndex", fragmented});
    fragmented.bFrames = 0;
    fragmented.segmentIndex = false;
    all.push_back({"FragmentedMp4", fragmented});
    MovieSpec full = recording(Container::Mp4, VideoCodec::H264_444, AudioCodec::AAC);
    full.width = 321;
    full.height = 241;
    all.push_back({"H264FullChroma", full});
    MovieSpec hevc = recording(Container::Mp4, VideoCodec::HEVC, AudioCodec::AAC);
    hevc.bFrames = 2;
    all.push_back({"Hevc", hevc});
    MovieSpec silent = recording(Container::Mp4, VideoCodec::H264, AudioCodec::AAC);
    silent.audio = false;
    all.push_back({"NoAudio", silent});
    MovieSpec twoTracks = recording(Container::Mp4, VideoCodec::H264, AudioCodec::AAC);
    twoTracks.audioTracks = 2;
    all.push_back({"TwoAudioTracks", twoTracks});
    MovieSpec vfr = recording(Container::Mp4, VideoCodec::H264, AudioCodec::AAC);
    vfr.variableFrameRate = true;
    all.push_back({"VariableFrameRate", vfr});
    MovieSpec late = recording(Container::Mp4, VideoCodec::H264, AudioCodec::AAC);
    late.startSeconds = 3.5;
    all.push_back({"TimestampsStartLateMp4", late});
    late.container = Container::Matroska;
    late.startSeconds = 12.25;
    all.push_back({"TimestampsStartLateMatroska", late});
    MovieSpec odd = recording(Container::WebM, VideoCodec::VP8, AudioCodec::Opus);
    odd.width = 321;
    odd.height = 239;
    all.push_back({"OddSizeVp8", odd});
    return all;
}

struct ExportProcess {
    int exitCode = -1;
    long peakResidentKb = 0;
};

// One pass-through export in a process of its own (the test's export tool),
// with that process's peak memory.
ExportProcess exportInProcess(const QString& source, const QString& output, double start,
                              double duration) {
    const QByteArray tool = TAMSEL_TEST_EXPORT_TOOL;
    const QByteArray from = QFile::encodeName(source), to = QFile::encodeName(output);
    const QByteArray s = QByteArray::number(start), d = QByteArray::number(duration);
    char* argv[] = {const_cast<char*>(tool.constData()), const_cast<char*>(from.constData()),
                    const_cast<char*>(to.constData()),   const_cast<char*>(s.constData()),
                    const_cast<char*>(d.constData()),    nullptr};
    ExportProcess result;
    pid_t child = 0;
    if (posix_spawn(&child, argv[0], nullptr, nullptr, argv, environ) != 0)
        return result;
    int status = 0;
    rusage usage{};
    if (wait4(child, &status, 0, &usage) == child && WIFEXITED(status))
        result.exitCode = WEXITSTATUS(status);
    result.peakResidentKb = usage.ru_maxrss;
    return result;
}

void PrintTo(const Kind& kind, std::ostream* os) {
    *os << kind.name;
}

class RecordingKind : public testing::TestWithParam<Kind> {};

// The strip's thumbnails: the keyframe at or before each time of the movie
// (the generator's default tolerance), the frames' own pictures.
void expectStrip(const std::shared_ptr<Asset>& asset, const MovieSpec& movieSpec,
                 std::initializer_list<double> times = {0.0, 1.3, 2.6}) {
    const ClipInfo original = probeClip(asset->url().toLocalFile());
    auto generator = ImageGenerator::imageGeneratorWithAsset(asset);
    generator->setMaximumSize(QSizeF(96, 72));
    for (double t : times) {
        int keyframe = 0;
        for (const ShownFrame& f : original.frames)
            if (f.seconds - original.startTime <= t + 1e-6 &&
                f.index % movieSpec.keyframeInterval == 0)
                keyframe = std::max(keyframe, f.index);
        MediaTime actual;
        ErrorPtr error;
        const QImage image = generator->copyImageAtTime_actualTime_error(
            MediaTime::fromSeconds(t, 600), &actual, &error);
        ASSERT_FALSE(image.isNull())
            << t << ": " << (error ? error->description().toStdString() : "");
        EXPECT_EQ(testmedia::readFrameIndex(image), keyframe) << "at " << t;
    }
}

} // namespace

TEST_P(RecordingKind, OpensFillsTheStripAndSavesTheRequestedRange) {
    const Kind& kind = GetParam();
    const QString source = movieFor(kind.movie);
    const QByteArray before = fileDigest(source);
    const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(source));
    ASSERT_FALSE(asset->error()) << asset->error()->description().toStdString();
    ASSERT_EQ(asset->tracksWithMediaType(MediaType::Video).size(), 1);
    EXPECT_EQ(asset->tracksWithMediaType(MediaType::Audio).size(),
              kind.movie.audio ? kind.movie.audioTracks : 0);
    EXPECT_NEAR(asset->duration().seconds(), kind.movie.seconds, 0.1);
    expectStrip(asset, kind.movie);

    const QString output = scratchPath(QStringLiteral("clip.mp4"));
    ExportRun run{makeSession(source, ExportPresetPassthrough, output, kind.start, kind.duration)};
    ASSERT_TRUE(run.runAndWait());
    ASSERT_EQ(run.session->status(), int(ExportSessionStatus::Completed)) << run.why();
    expectFaithfulCut(kind.movie, source, output, kind.start, kind.duration);
    EXPECT_FALSE(leftovers(output));
    EXPECT_EQ(fileDigest(source), before);
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
    MovieSpec fragmented = recording(Container::FragmentedMp4, VideoCodec::H264, AudioCodec::AAC);
    fragmented.seconds = 6;
    fragmented.bFrames = 2;
    fragmented.truncated = true;
    MovieSpec webm = recording(Container::WebM, VideoCodec::VP8, AudioCodec::Vorbis);
    webm.seconds = 6;
    webm.truncated = true;
    for (const MovieSpec& movieSpec : {fragmented, webm}) {
        const QString source = movieFor(movieSpec);
        SCOPED_TRACE(source.toStdString());
        const QByteArray before = fileDigest(source);
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
        const double start = 0.7;
        ExportRun run{makeSession(source, ExportPresetPassthrough, output, start, duration)};
        ASSERT_TRUE(run.runAndWait());
        ASSERT_EQ(run.session->status(), int(ExportSessionStatus::Completed)) << run.why();
        expectFaithfulCut(movieSpec, source, output, start, duration - start);
        EXPECT_EQ(fileDigest(source), before);
    }
}

// Users name their recordings as they like; nothing is quoted by a shell or
// read as a URL, so quotes, spaces and non-ASCII letters change nothing.
TEST(RecordingNames, QuotesSpacesAndNonAsciiLettersAreJustNames) {
    MovieSpec movieSpec = recording(Container::WebM, VideoCodec::VP9, AudioCodec::Opus);
    const QString folder = scratchPath(QStringLiteral("Bildschirmaufnahmen 'écran' \"録画\""));
    ASSERT_TRUE(QDir().mkpath(folder));
    const QString source = folder + QStringLiteral("/It's a \"test\" – ünïcode #1 ?.webm");
    ASSERT_TRUE(QFile::copy(movieFor(movieSpec), source));
    const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(source));
    ASSERT_FALSE(asset->error());
    expectStrip(asset, movieSpec, {0.0, 1.3});
    const QString output = folder + QStringLiteral("/Racer's \"clip\" 100% é_1700000000.mp4");
    ExportRun run{makeSession(source, ExportPresetPassthrough, output, 1.3, 1.0)};
    ASSERT_TRUE(run.runAndWait());
    ASSERT_EQ(run.session->status(), int(ExportSessionStatus::Completed)) << run.why();
    expectFaithfulCut(movieSpec, source, output, 1.3, 1.0);
}

// Two hours at one frame a second, big frames: saving all of it takes no
// more memory than saving a minute (each export in a process of its own,
// both ways of copying).
TEST(LongRecording, SavesHoursWithFlatMemory) {
    MovieSpec movieSpec;
    movieSpec.width = 320;
    movieSpec.height = 240;
    movieSpec.fps = 1;
    movieSpec.seconds = 2 * 3600;
    movieSpec.keyframeInterval = 60;
    movieSpec.crf = 4; // large frames, so holding them would show
    movieSpec.audio = false;
    const QString source = movieFor(movieSpec);
    ASSERT_GT(QFileInfo(source).size(), 40ll << 20);
    const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(source));
    EXPECT_NEAR(asset->duration().seconds(), 7200, 1);

    for (const char* remux : {"1", ""}) {
        testing_support::ScopedEnv env("TAMSEL_EXPORT_REMUX", remux);
        SCOPED_TRACE(testing::Message() << "remux '" << remux << "'");
        const QString minute = scratchPath(QStringLiteral("minute.mp4"));
        const QString hours = scratchPath(QStringLiteral("hours.mp4"));
        const ExportProcess small = exportInProcess(source, minute, 5000.5, 60);
        const ExportProcess large = exportInProcess(source, hours, 100.5, 7000);
        ASSERT_EQ(small.exitCode, 0);
        ASSERT_EQ(large.exitCode, 0);
        EXPECT_LT(large.peakResidentKb - small.peakResidentKb, 8 * 1024);
        const ClipInfo clip = probeClip(hours, 3);
        ASSERT_EQ(clip.frames.size(), 3u);
        EXPECT_EQ(clip.frames.front().index, 100);
        EXPECT_EQ(clip.frames[1].index, 101);
        EXPECT_NEAR(clip.videoDuration, 7000 - 0.5, 1.0);
        EXPECT_EQ(probeClip(minute, 1).frames.front().index, 5000);
        QFile::remove(hours);
    }
}
