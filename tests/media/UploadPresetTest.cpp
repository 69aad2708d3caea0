// The highest-quality preset makes the upload file: what MP4 holds and the
// video sites take is copied untouched, the rest encoded, and the audio
// tracks that the mix names are heard together in one track, at the mix's
// volume.

#include "ExportChecks.h"
#include "MediaFixtures.h"
#include "platform/media/Asset.h"

#include <gtest/gtest.h>

using namespace platform;
using namespace mediatest;
using testmedia::MovieSpec;
using C = testmedia::Container;
using V = testmedia::VideoCodec;
using A = testmedia::AudioCodec;

namespace {

// The upload of [start, start + duration), with an audio mix naming every
// audio track at `volume`.
std::shared_ptr<ExportSession> uploadSession(const QString& source, const QString& output,
                                             double start, double duration, float volume = 1) {
    auto session = makeSession(source, output, start, duration, ExportPresetHighestQuality);
    AudioMix mix;
    for (const AssetTrack& track : session->asset()->tracksWithMediaType(MediaType::Audio)) {
        mix.inputParameters.append(
            AudioMixInputParameters::audioMixInputParametersWithTrack(track));
        mix.inputParameters.last().volume = volume;
    }
    session->setAudioMix(mix);
    return session;
}

} // namespace

TEST(UploadPreset, CopiesWhatTheSitesTakeUntouchedAndEncodesTheRest) {
    const struct {
        MovieSpec movie;
        const char* codecs; // of the upload, video then audio
        bool videoCopied;
    } cases[] = {
        {{.seconds = 3, .container = C::WebM, .videoCodec = V::VP9, .audioCodec = A::Opus},
         "vp9 opus",
         true},
        {{.seconds = 3, .container = C::Matroska, .videoCodec = V::HEVC}, "hevc aac", true},
        {{.seconds = 3, .rotationDegrees = 270, .videoCodec = V::H264_444}, "h264 aac", true},
        {{.seconds = 3, .container = C::WebM, .videoCodec = V::VP8, .audioCodec = A::Vorbis},
         "h264 aac",
         false},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(testmedia::suffixFor(c.movie).toStdString() + " to " + c.codecs);
        const QString source = movieFor(c.movie);
        const QString output = scratchPath(QStringLiteral("upload.mp4"));
        ASSERT_TRUE(completes(uploadSession(source, output, 0, c.movie.seconds)));
        const ClipInfo clip = probeClip(output);
        EXPECT_EQ(clip.videoCodec + ' ' + clip.audioCodec, QLatin1String(c.codecs));
        // Copied means the very bytes: no generation loss.
        EXPECT_EQ(probeClip(source).keyframes.contains(clip.keyframes.value(0)), c.videoCopied);
        expectFaithfulCut(c.movie, source, output, 0, c.movie.seconds);
    }
}

// A desktop track and a microphone track become one track in which both are
// heard, each where it was; the video is copied as it is.
TEST(UploadPreset, MixesTheNamedAudioTracksIntoOne) {
    const MovieSpec movieSpec{.seconds = 4, .audioTracks = 2};
    const QString source = movieFor(movieSpec);
    const QString output = scratchPath(QStringLiteral("mixed.mp4"));
    ASSERT_TRUE(completes(uploadSession(source, output, 0, movieSpec.seconds)));
    const ClipInfo clip = probeClip(output);
    EXPECT_TRUE(probeClip(source).keyframes.contains(clip.keyframes.value(0)));
    expectFaithfulCut(movieSpec, source, output, 0, movieSpec.seconds, true);
    // Summed, not averaged: each burst as loud as in its own track.
    EXPECT_NEAR(clip.audioPeak, 0.5, 0.08);

    // From inside a keyframe interval the mix starts where the video does.
    const QString cut = scratchPath(QStringLiteral("mixed-cut.mp4"));
    ASSERT_TRUE(completes(uploadSession(source, cut, 0.9, 2.4)));
    expectFaithfulCut(movieSpec, source, cut, 0.9, 2.4, true);
}

// A volume other than 1 needs the audio encoded; the video is still copied.
TEST(UploadPreset, EncodesTheAudioAtTheMixVolume) {
    const MovieSpec movieSpec;
    const QString source = movieFor(movieSpec);
    const QString output = scratchPath(QStringLiteral("quiet.mp4"));
    ASSERT_TRUE(completes(uploadSession(source, output, 0.5, 1.0, 0.25f)));
    const ClipInfo clip = probeClip(output);
    ASSERT_FALSE(clip.frames.empty());
    EXPECT_EQ(clip.frames.front().index, 15);
    EXPECT_NEAR(clip.videoDuration, 1.0, 1.0 / movieSpec.fps);
    // The bursts peak at 0.5 in the source; a quarter of that here.
    EXPECT_NEAR(clip.audioPeak, 0.125, 0.03);
    EXPECT_TRUE(probeClip(source).keyframes.contains(clip.keyframes.value(0)));
}
