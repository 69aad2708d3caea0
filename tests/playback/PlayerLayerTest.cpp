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
using namespace playback_test;
using testing_support::waitUntil;

namespace {

// The layer shows `frame` (of the coded picture, turned back by `degrees`).
bool shows(MpvPlayerLayer& layer, int frame, int degrees = 0) {
    int shown = -1;
    const bool found = waitUntil(
        [&] {
            const QImage image = layer.grab().toImage();
            shown = testmedia::readFrameIndex(image.transformed(QTransform().rotate(-degrees)));
            return shown == frame;
        },
        5000);
    EXPECT_TRUE(found) << "shows frame " << shown << ", not " << frame;
    return found;
}

std::unique_ptr<MpvPlayerLayer> shownLayer(const std::shared_ptr<Player>& player,
                                           QSize size = QSize(320, 240)) {
    auto layer = std::make_unique<MpvPlayerLayer>();
    layer->setFrame(QRect(QPoint(), size)); // the clips' own size: no bars
    layer->setPlayer(player);
    layer->show();
    return layer;
}

} // namespace

TEST(PlaybackPlayerLayer, ExactSeeksLandOnTheRequestedTimeAndShowItsFrame) {
    testmedia::MovieSpec variable = plain(2);
    variable.variableFrameRate = true;
    variable.keyframeInterval = 25;
    const struct {
        QUrl url;
        testmedia::MovieSpec movie;
        QList<int> frames; // between keyframes, on one, and backwards
    } clips[] = {{clip(2), plain(2), {17, 45, 30, 3, 59}},
                 {clipUrl("vfr", variable), variable, {13, 37, 24, 51}}};
    for (const auto& c : clips) {
        SCOPED_TRACE(c.url.fileName().toStdString());
        auto item = PlayerItem::playerItemWithURL(c.url);
        auto player = Player::playerWithPlayerItem(item);
        auto layer = shownLayer(player);
        // Offscreen in software, or under a GL-capable X server with OpenGL
        // forced: the same test runs on both paths.
        const QString forced = qEnvironmentVariable("TAMSEL_VIDEO_RENDERER");
        if (forced == "opengl" || forced == "software" ||
            QGuiApplication::platformName() == "offscreen") {
            EXPECT_EQ(layer->usesOpenGL(), forced == "opengl");
        }
        ASSERT_EQ(waitForStatus(item), PlayerItem::Status::ReadyToPlay);
        ASSERT_TRUE(waitUntil([&] { return layer->isReadyForDisplay(); }));
        shows(*layer, 0);

        const std::int32_t scale = player->currentTime().timescale;
        const bool constant = !c.movie.variableFrameRate;
        for (int frame : c.frames) {
            SCOPED_TRACE(frame);
            const MediaTime target = MediaTime::fromSeconds(
                constant ? frame / 30.0 : testmedia::frameTime(c.movie, frame), scale);
            bool finished = false;
            player->seekToTime_toleranceBefore_toleranceAfter_completionHandler(
                target, MediaTime::zero(), MediaTime::zero(), [&](bool done) { finished = done; });
            EXPECT_EQ(player->currentTime(), target) << "the target is reported while seeking";
            ASSERT_TRUE(waitUntil([&] { return finished; }));
            EXPECT_EQ(player->currentTime(), target);
            EXPECT_EQ(item->currentTime(), target);
            shows(*layer, frame);
        }
        if (!constant)
            continue;
        // The default tolerance shows the frame at the time too; resized while
        // paused, the same frame is drawn at the new size.
        player->seekToTime(MediaTime::fromSeconds(52 / 30.0, scale));
        ASSERT_TRUE(waitUntil([&] { return !player->isSeeking(); }));
        shows(*layer, 52);
        layer->setFrame(QRect(0, 0, 160, 120));
        shows(*layer, 52);
    }
}

TEST(PlaybackPlayerLayer, ScrubbingEndsOnTheLastRequestedFrame) {
    auto player = readyPlayer(PlayerItem::playerItemWithURL(clip(2)));
    auto layer = shownLayer(player);
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
    shows(*layer, frame);
}

TEST(PlaybackPlayerLayer, ShowsTurnedRecordingsUpright) {
    for (int degrees : {90, 180, 270}) {
        SCOPED_TRACE(degrees);
        testmedia::MovieSpec movieSpec = plain(1);
        movieSpec.rotationDegrees = degrees;
        auto item =
            PlayerItem::playerItemWithURL(clipUrl(QString("turned%1").arg(degrees), movieSpec));
        // The coded size turned, so the picture fills the layer.
        auto layer = shownLayer(Player::playerWithPlayerItem(item),
                                degrees == 180 ? QSize(320, 240) : QSize(240, 320));
        ASSERT_EQ(waitForStatus(item), PlayerItem::Status::ReadyToPlay);
        ASSERT_TRUE(waitUntil([&] { return layer->isReadyForDisplay(); }));
        shows(*layer, 0, degrees);
    }
}

TEST(PlaybackPlayerLayer, LayersComeAndGoWhilePlaybackGoesOnAndHoldTheirPlayer) {
    auto item = PlayerItem::playerItemWithURL(clip(2));
    EndWatcher end(item);
    auto player = readyPlayer(item);
    player->play();
    ASSERT_TRUE(waitUntil([&] { return player->currentTime().seconds() > 0.3; }));

    // A layer arrives while the video plays headless, then a second layer
    // takes it over, then the second goes away: the clock keeps running and
    // the item still ends, though only the layer refers to the player now.
    auto first = shownLayer(player);
    ASSERT_TRUE(waitUntil([&] { return first->isReadyForDisplay(); }));
    auto second = shownLayer(player);
    ASSERT_TRUE(waitUntil([&] { return second->isReadyForDisplay(); }));
    second.reset();
    const std::weak_ptr<Player> held = player;
    player.reset();
    ASSERT_TRUE(end.waitFor(1));

    // At the end the last frame stays up, also when the layer takes the
    // player anew.
    player = first->player();
    first->setPlayer(nullptr);
    first->setPlayer(player);
    player.reset();
    shows(*first, testmedia::frameCount(plain(2)) - 1);

    // Pointed at a new player, the layer lets the old one go.
    first->setPlayer(Player::playerWithURL(clip(1)));
    EXPECT_TRUE(held.expired());
    ASSERT_EQ(waitForStatus(first->player()->currentItem()), PlayerItem::Status::ReadyToPlay);
    shows(*first, 0);
}
