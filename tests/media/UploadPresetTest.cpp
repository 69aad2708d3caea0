// The highest-quality preset makes the upload file: what MP4 holds and the
// video sites take is copied untouched, the rest encoded, and the audio
// tracks that the mix names are heard together in one track.

#include "ExportChecks.h"
#include "MediaFixtures.h"
#include "platform/media/Asset.h"

#include <gtest/gtest.h>

using namespace platform;
using namespace mediatest;
using testmedia::AudioCodec;
using testmedia::Container;
using testmedia::MovieSpec;
using testmedia::VideoCodec;

namespace {

MovieSpec recording(Container container, VideoCodec video, AudioCodec audio) {
    MovieSpec s;
    s.seconds = 3;
    s.container = container;
    s.videoCodec = video;
    s.audioCodec = audio;
    return s;
}

// The whole recording, as the upload is prepared, with an audio mix naming
// every audio track.
std::shared_ptr<ExportSession> uploadSession(const QString& source, const QString& output) {
    auto session = ExportSession::exportSessionWithAsset_presetName(
        Asset::assetWithURL(QUrl::fromLocalFile(source)), ExportPresetHighestQuality);
    session->setOutputURL(QUrl::fromLocalFile(output));
    session->setOutputFileType(FileTypeMPEG4);
    AudioMix mix;
    for (const AssetTrack& track : session->asset()->tracksWithMediaType(MediaType::Audio))
        mix.inputParameters.append(
            AudioMixInputParameters::audioMixInputParametersWithTrack(track));
    session->setAudioMix(mix);
    return session;
}

} // namespace

TEST(UploadPreset, CopiesWhatTheSitesTakeUntouchedAndEncodesTheRest) {
    struct Case {
        const char* name;
        MovieSpec movie;
        const char* video;
        const char* audio;
        bool videoCopied;
    };
    const Case cases[] = {
        {"VP9 and Opus", recording(Container::WebM, VideoCodec::VP9, AudioCodec::Opus), "vp9",
         "opus", true},
        {"HEVC and AAC", recording(Container::Matroska, VideoCodec::HEVC, AudioCodec::AAC), "hevc",
         "aac", true},
        {"H.264 4:4:4", recording(Container::Mp4, VideoCodec::H264_444, AudioCodec::AAC), "h264",
         "aac", true},
        {"VP8 and Vorbis", recording(Container::WebM, VideoCodec::VP8, AudioCodec::Vorbis), "h264",
         "aac", false},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.name);
        const QString source = movieFor(c.movie);
        const QString output = scratchPath(QStringLiteral("upload.mp4"));
        ExportRun run{uploadSession(source, output)};
        ASSERT_TRUE(run.runAndWait(120000));
        ASSERT_EQ(run.session->status(), int(ExportSessionStatus::Completed)) << run.why();
        const ClipInfo clip = probeClip(output);
        EXPECT_EQ(clip.videoCodec.toStdString(), c.video);
        EXPECT_EQ(clip.audioCodec.toStdString(), c.audio);
        // Copied means the very bytes: no generation loss.
        EXPECT_EQ(videoKeyframes(source).contains(clip.firstVideoPacket), c.videoCopied);
        expectFaithfulCut(c.movie, source, output, 0, c.movie.seconds);
    }
}

// A desktop track and a microphone track become one track in which both are
// heard, each where it was; the video is copied as it is.
TEST(UploadPreset, MixesTheNamedAudioTracksIntoOne) {
    MovieSpec movieSpec = recording(Container::Mp4, VideoCodec::H264, AudioCodec::AAC);
    movieSpec.audioTracks = 2;
    movieSpec.seconds = 4;
    const QString source = movieFor(movieSpec);
    const QString output = scratchPath(QStringLiteral("mixed.mp4"));
    ExportRun run{uploadSession(source, output)};
    ASSERT_TRUE(run.runAndWait(120000));
    ASSERT_EQ(run.session->status(), int(ExportSessionStatus::Completed)) << run.why();
    const ClipInfo clip = probeClip(output);
    EXPECT_TRUE(videoKeyframes(source).contains(clip.firstVideoPacket));
    expectFaithfulCut(movieSpec, source, output, 0, movieSpec.seconds, true);
    // Summed, not averaged: each burst as loud as in its own track.
    EXPECT_NEAR(clip.audioPeak, 0.5, 0.08);

    // From inside a keyframe interval the mix starts where the video does.
    const QString cut = scratchPath(QStringLiteral("mixed-cut.mp4"));
    auto session = uploadSession(source, cut);
    session->setTimeRange(
        MediaTimeRange::make(MediaTime::fromSeconds(0.9, 600), MediaTime::fromSeconds(2.4, 600)));
    ExportRun part{session};
    ASSERT_TRUE(part.runAndWait(120000));
    ASSERT_EQ(part.session->status(), int(ExportSessionStatus::Completed)) << part.why();
    expectFaithfulCut(movieSpec, source, cut, 0.9, 2.4, true);
}
