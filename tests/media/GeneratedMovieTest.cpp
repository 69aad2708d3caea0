// The generated recordings and how the asset reads them.
#include "ClipProbe.h"
#include "MediaFixtures.h"
#include "platform/media/Asset.h"

#include "support/TempDir.h"
#include <QFile>
#include <gtest/gtest.h>

using namespace platform;
using mediatest::movieFor;
using mediatest::probeClip;

TEST(GeneratedMovie, EveryFrameCarriesItsIndexAndEverySecondItsBurst) {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 3;
    movieSpec.variableFrameRate = true;
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

TEST(GeneratedMovie, FrameCodeSurvivesScalingAndRejectsOtherPictures) {
    QImage frame(320, 240, QImage::Format_RGB32);
    frame.fill(Qt::black);
    EXPECT_EQ(testmedia::readFrameIndex(frame), 0);
    frame.fill(QColor(128, 128, 128));
    EXPECT_EQ(testmedia::readFrameIndex(frame), -1);
    EXPECT_EQ(testmedia::readFrameIndex(QImage()), -1);
}

TEST(Asset, DescribesTracksSizesTransformAndDuration) {
    testmedia::MovieSpec movieSpec;
    movieSpec.width = 320;
    movieSpec.height = 180;
    movieSpec.rotationDegrees = 90;
    movieSpec.seconds = 2;
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
    EXPECT_NEAR(video.timeRange.duration.seconds(), 2.0, 1e-6);
    EXPECT_NEAR(asset->duration().seconds(), 2.0, 0.03);
    EXPECT_EQ(asset->duration().timescale, 90000);
    EXPECT_EQ(asset->tracksWithMediaType(MediaType::Audio).first().naturalTimeScale, 48000);
}

TEST(Asset, SilentMovieHasOnlyItsVideoTrack) {
    testmedia::MovieSpec movieSpec;
    movieSpec.audio = false;
    const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(movieFor(movieSpec)));
    EXPECT_EQ(asset->tracks().size(), 1);
    EXPECT_TRUE(asset->tracksWithMediaType(MediaType::Audio).isEmpty());
    EXPECT_TRUE(asset->tracks().first().preferredTransform.isIdentity());
}

TEST(Asset, WhatIsNotAMovieGivesNoTracksAndAnError) {
    testmedia::MovieSpec truncated;
    truncated.truncated = true;
    const QString text = mediatest::scratchPath(QStringLiteral("readme.mov"));
    {
        QFile f(text);
        ASSERT_TRUE(f.open(QIODevice::WriteOnly));
        f.write(QByteArray(4096, 'x'));
    }
    const QString empty = mediatest::scratchPath(QStringLiteral("empty.mp4"));
    QFile(empty).open(QIODevice::WriteOnly);
    for (const QUrl& url :
         {QUrl::fromLocalFile(movieFor(truncated)), QUrl::fromLocalFile(text),
          QUrl::fromLocalFile(empty), QUrl::fromLocalFile(QStringLiteral("/no/such/movie.mp4")),
          QUrl(QStringLiteral("https://example.invalid/movie.mp4")), QUrl()}) {
        SCOPED_TRACE(url.toString().toStdString());
        const auto asset = Asset::assetWithURL(url);
        ASSERT_TRUE(asset);
        EXPECT_TRUE(asset->tracks().isEmpty());
        ASSERT_TRUE(asset->error());
        EXPECT_NE(asset->error()->code(), 0);
        EXPECT_FALSE(asset->isPlayable());
        EXPECT_FALSE(asset->duration().isValid());
        EXPECT_EQ(asset->url(), url);
    }
}

TEST(Asset, MapsDevicePaths) {
    testing_support::MobileRoot root;
    root.makeLibrary();
    testmedia::MovieSpec movieSpec;
    ASSERT_TRUE(
        QFile::copy(movieFor(movieSpec), root.hostPath(QStringLiteral("Library/Tamsel/clip.mp4"))));
    const auto asset = Asset::assetWithURL(
        QUrl::fromLocalFile(QStringLiteral("/private/var/mobile/Library/Tamsel/clip.mp4")));
    EXPECT_FALSE(asset->error());
    EXPECT_EQ(asset->tracks().size(), 2);
}
