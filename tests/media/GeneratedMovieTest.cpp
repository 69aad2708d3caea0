// The generated recordings that every media test relies on, and how the
// asset describes one.
#include "ClipProbe.h"
#include "MediaFixtures.h"
#include "platform/media/Asset.h"

#include <gtest/gtest.h>

using namespace platform;
using mediatest::movieFor;
using mediatest::probeClip;

TEST(GeneratedMovie, EveryFrameCarriesItsIndexAndEverySecondItsBurst) {
    const testmedia::MovieSpec movieSpec{.seconds = 3, .variableFrameRate = true};
    const mediatest::ClipInfo clip = probeClip(movieFor(movieSpec));
    ASSERT_EQ(int(clip.frames.size()), testmedia::frameCount(movieSpec));
    for (size_t i = 0; i < clip.frames.size(); ++i) {
        EXPECT_EQ(clip.frames[i].index, int(i));
        EXPECT_NEAR(clip.frames[i].seconds, testmedia::frameTime(movieSpec, int(i)), 1e-4);
    }
    // Uneven: some steps are well away from 1/fps either way.
    double shortest = 1, longest = 0;
    for (size_t i = 1; i < clip.frames.size(); ++i) {
        shortest = std::min(shortest, clip.frames[i].seconds - clip.frames[i - 1].seconds);
        longest = std::max(longest, clip.frames[i].seconds - clip.frames[i - 1].seconds);
    }
    EXPECT_LT(shortest, 0.7 / movieSpec.fps);
    EXPECT_GT(longest, 1.3 / movieSpec.fps);
    ASSERT_GE(clip.burstOnsets.size(), 3u);
    for (size_t s = 0; s < clip.burstOnsets.size(); ++s)
        EXPECT_NEAR(clip.burstOnsets[s], double(s), 0.002);
    EXPECT_NEAR(clip.audioDuration, 3.0, 1.0 / movieSpec.fps);
}

TEST(Asset, DescribesTracksSizesTransformAndDuration) {
    const testmedia::MovieSpec movieSpec{.height = 180, .rotationDegrees = 90};
    const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(movieFor(movieSpec)));
    ASSERT_FALSE(asset->error());
    EXPECT_TRUE(asset->isPlayable());
    const QList<AssetTrack> tracks = asset->tracks();
    ASSERT_EQ(tracks.size(), 2);
    EXPECT_EQ(tracks[0].trackID, 1);
    EXPECT_EQ(tracks[0].mediaType, MediaType::Video);
    EXPECT_EQ(tracks[1].trackID, 2);
    EXPECT_EQ(tracks[1].mediaType, MediaType::Audio);
    const AssetTrack video = asset->tracksWithMediaType(MediaType::Video).first();
    EXPECT_EQ(video.naturalSize, QSizeF(320, 180));
    EXPECT_EQ(video.naturalTimeScale, 90000);
    EXPECT_NEAR(video.nominalFrameRate, 30, 0.01);
    // Turned a quarter clockwise: the upright picture is 180 wide, 320 high.
    EXPECT_EQ(video.preferredTransform, QTransform(0, 1, -1, 0, 180, 0));
    EXPECT_EQ(video.preferredTransform.mapRect(QRectF(QPointF(), video.naturalSize)),
              QRectF(0, 0, 180, 320));
    // The probe that checks saved clips reads the same turn.
    EXPECT_EQ(probeClip(movieFor(movieSpec), 1).transform, video.preferredTransform);
    EXPECT_NEAR(video.timeRange.duration.seconds(), 2.0, 1e-6);
    EXPECT_NEAR(asset->duration().seconds(), 2.0, 0.03);
    EXPECT_EQ(asset->duration().timescale, 90000);
    EXPECT_EQ(asset->tracksWithMediaType(MediaType::Audio).first().naturalTimeScale, 48000);
}
