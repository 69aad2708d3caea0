// How the asset describes a recording.
#include "platform/media/Asset.h"
#include "ClipProbe.h"
#include "MediaFixtures.h"

#include <gtest/gtest.h>

using namespace platform;
using mediatest::movieFor;
using mediatest::probeClip;

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
