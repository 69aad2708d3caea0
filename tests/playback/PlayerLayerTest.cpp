#include "MediaGenerator.h"
#include "PlaybackFixture.h"
#include "platform/media/playback/MpvPlayerLayer.h"
#include "support/Wait.h"

#include <QCoreApplication>
#include <QGuiApplication>
#include <QImage>
#include <QTransform>

#include <gtest/gtest.h>

#include <memory>

using namespace platform;
using playback_test::clipUrl;
using playback_test::EndWatcher;
using playback_test::waitForStatus;
using testing_support::waitUntil;

namespace {

// The frame index the layer shows, or -1.
int shownFrame(MpvPlayerLayer& layer) {
    return testmedia::readFrameIndex(layer.grab().toImage());
}

std::unique_ptr<MpvPlayerLayer> shownLayer(const std::shared_ptr<Player>& player) {
    auto layer = std::make_unique<MpvPlayerLayer>();
    layer->setFrame(QRect(0, 0, 320, 240)); // the clips' own size: no bars
    layer->setPlayer(player);
    layer->show();
    return layer;
}

} // namespace

TEST(PlaybackPlayerLayer, ShowsTheFrameAtEachSeek) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("two", playback_test::twoSeconds()));
    auto player = Player::playerWithPlayerItem(item);
    auto layer = shownLayer(player);
    // The same test runs on both paths: offscreen in software, and under a
    // GL-capable X server with OpenGL forced.
    const QString forced = qEnvironmentVariable("TAMSEL_VIDEO_RENDERER");
    if (forced == "opengl") {
        EXPECT_TRUE(layer->usesOpenGL()) << "GL was forced and is there";
    } else if (forced == "software" || QGuiApplication::platformName() == "offscreen") {
        EXPECT_FALSE(layer->usesOpenGL());
    }
    ASSERT_EQ(waitForStatus(item), PlayerItem::Status::ReadyToPlay);
    ASSERT_TRUE(waitUntil([&] { return layer->isReadyForDisplay(); }));
    EXPECT_TRUE(waitUntil([&] { return shownFrame(*layer) == 0; }, 5000)) << shownFrame(*layer);

    const std::int32_t scale = player->currentTime().timescale;
    for (int frame : {17, 44, 31, 2}) {
        SCOPED_TRACE(frame);
        bool finished = false;
        player->seekToTime_toleranceBefore_toleranceAfter_completionHandler(
            MediaTime::fromSeconds(frame / 30.0, scale), MediaTime::zero(), MediaTime::zero(),
            [&](bool done) { finished = done; });
        ASSERT_TRUE(waitUntil([&] { return finished; }));
        EXPECT_TRUE(waitUntil([&] { return shownFrame(*layer) == frame; }, 5000))
            << shownFrame(*layer);
    }
    // The default tolerance shows the frame at the time too.
    player->seekToTime(MediaTime::fromSeconds(52 / 30.0, scale));
    EXPECT_TRUE(waitUntil([&] { return !player->isSeeking() && shownFrame(*layer) == 52; }, 5000))
        << shownFrame(*layer);

    // Resized while paused, the same frame is drawn at the new size.
    layer->setFrame(QRect(0, 0, 160, 120));
    EXPECT_TRUE(waitUntil([&] { return shownFrame(*layer) == 52; }, 5000)) << shownFrame(*layer);
}

TEST(PlaybackPlayerLayer, ScrubbingEndsOnTheLastRequestedFrame) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("two", playback_test::twoSeconds()));
    auto player = Player::playerWithPlayerItem(item);
    auto layer = shownLayer(player);
    ASSERT_EQ(waitForStatus(item), PlayerItem::Status::ReadyToPlay);
    const std::int32_t scale = player->currentTime().timescale;
    // A drag: a seek for every move, each taking the last one's place, with
    // the loop turning only now and then.
    int frame = 0;
    for (int step = 0; step < 40; ++step) {
        frame = (step * 7) % 60;
        player->seekToTime(MediaTime::fromSeconds(frame / 30.0, scale));
        if (step % 5 == 0)
            QCoreApplication::processEvents();
    }
    const MediaTime last = MediaTime::fromSeconds(frame / 30.0, scale);
    EXPECT_EQ(player->currentTime(), last);
    ASSERT_TRUE(waitUntil([&] { return !player->isSeeking(); }));
    EXPECT_EQ(player->currentTime(), last);
    EXPECT_TRUE(waitUntil([&] { return shownFrame(*layer) == frame; }, 5000)) << shownFrame(*layer);
}

TEST(PlaybackPlayerLayer, ExactSeeksOnAVariableFrameRateRecordingShowTheirFrame) {
    testmedia::MovieSpec movieSpec = playback_test::twoSeconds();
    movieSpec.variableFrameRate = true;
    movieSpec.keyframeInterval = 25;
    auto item = PlayerItem::playerItemWithURL(clipUrl("vfr", movieSpec));
    auto player = Player::playerWithPlayerItem(item);
    auto layer = shownLayer(player);
    ASSERT_EQ(waitForStatus(item), PlayerItem::Status::ReadyToPlay);
    const std::int32_t scale = player->currentTime().timescale;
    for (int frame : {13, 37, 24, 51}) {
        SCOPED_TRACE(frame);
        const MediaTime at = MediaTime::fromSeconds(testmedia::frameTime(movieSpec, frame), scale);
        bool finished = false;
        player->seekToTime_toleranceBefore_toleranceAfter_completionHandler(
            at, MediaTime::zero(), MediaTime::zero(), [&](bool done) { finished = done; });
        ASSERT_TRUE(waitUntil([&] { return finished; }));
        EXPECT_EQ(player->currentTime(), at) << player->currentTime().description().toStdString();
        EXPECT_TRUE(waitUntil([&] { return shownFrame(*layer) == frame; }, 5000))
            << shownFrame(*layer);
    }
}

TEST(PlaybackPlayerLayer, ShowsTurnedRecordingsUpright) {
    for (int degrees : {90, 180, 270}) {
        SCOPED_TRACE(degrees);
        testmedia::MovieSpec movieSpec = playback_test::oneSecond();
        movieSpec.rotationDegrees = degrees;
        auto item = PlayerItem::playerItemWithURL(
            clipUrl(QStringLiteral("turned%1").arg(degrees), movieSpec));
        auto player = Player::playerWithPlayerItem(item);
        auto layer = std::make_unique<MpvPlayerLayer>();
        // The coded size turned, so the picture fills the layer.
        layer->setFrame(degrees == 180 ? QRect(0, 0, 320, 240) : QRect(0, 0, 240, 320));
        layer->setPlayer(player);
        layer->show();
        ASSERT_EQ(waitForStatus(item), PlayerItem::Status::ReadyToPlay);
        ASSERT_TRUE(waitUntil([&] { return layer->isReadyForDisplay(); }));
        // Turned back, the picture is the coded frame.
        const auto codedFrame = [&] {
            const QImage shown = layer->grab().toImage();
            return testmedia::readFrameIndex(shown.transformed(QTransform().rotate(-degrees)));
        };
        EXPECT_TRUE(waitUntil([&] { return codedFrame() == 0; }, 5000)) << codedFrame();
    }
}

TEST(PlaybackPlayerLayer, TakingTheVideoOverMidwayKeepsPlaybackGoing) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("two", playback_test::twoSeconds()));
    EndWatcher end(item);
    auto player = Player::playerWithPlayerItem(item);
    ASSERT_EQ(waitForStatus(item), PlayerItem::Status::ReadyToPlay);
    player->play();
    ASSERT_TRUE(waitUntil([&] { return player->currentTime().seconds() > 0.3; }));

    // A layer arrives while the video plays headless, then a second layer
    // takes it over, then the second goes away: the clock keeps running and
    // the item still ends.
    auto first = shownLayer(player);
    ASSERT_TRUE(waitUntil([&] { return first->isReadyForDisplay(); }));
    auto second = shownLayer(player);
    ASSERT_TRUE(waitUntil([&] { return second->isReadyForDisplay(); }));
    second.reset();
    ASSERT_TRUE(waitUntil([&] { return end.count() == 1; }, 15000));

    // At the end the last frame stays up.
    first->setPlayer(nullptr);
    first->setPlayer(player);
    const int last = testmedia::frameCount(playback_test::twoSeconds()) - 1;
    EXPECT_TRUE(waitUntil([&] { return shownFrame(*first) == last; }, 5000)) << shownFrame(*first);
}

TEST(PlaybackPlayerLayer, ALayerOutlivingItsPlayerReferenceIsSafe) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("one", playback_test::oneSecond()));
    auto layer = shownLayer(Player::playerWithPlayerItem(item));
    ASSERT_EQ(waitForStatus(item), PlayerItem::Status::ReadyToPlay);
    // The layer holds the player: it plays on though nobody else refers to it.
    EndWatcher end(item);
    layer->player()->play();
    ASSERT_TRUE(waitUntil([&] { return end.count() == 1; }, 15000));
    // Pointed at a new player, the layer lets the old one go.
    std::weak_ptr<Player> old = layer->player();
    auto next = Player::playerWithURL(clipUrl("two", playback_test::twoSeconds()));
    layer->setPlayer(next);
    EXPECT_TRUE(old.expired());
    ASSERT_EQ(waitForStatus(next->currentItem()), PlayerItem::Status::ReadyToPlay);
    EXPECT_TRUE(waitUntil([&] { return shownFrame(*layer) == 0; }, 5000)) << shownFrame(*layer);
}
