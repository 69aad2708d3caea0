#include "platform/media/playback/Player.h"
#include "PlaybackFixture.h"
#include "platform/media/playback/NotificationCenter.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/MainQueue.h"
#include "support/Wait.h"

#include <QThread>

#include <gtest/gtest.h>

#include <atomic>
#include <cmath>

using namespace platform;
using playback_test::clipUrl;
using playback_test::EndWatcher;
using playback_test::waitForStatus;
using testing_support::waitUntil;

namespace {

// The interval the editor's playhead observer uses.
const MediaTime kThirtieth = MediaTime::fromSeconds(1.0 / 30.0, 1000000000);

std::shared_ptr<Player> readyPlayer(const std::shared_ptr<PlayerItem>& item) {
    auto player = Player::playerWithPlayerItem(item);
    EXPECT_EQ(waitForStatus(item), PlayerItem::Status::ReadyToPlay);
    return player;
}

} // namespace

TEST(PlaybackPlayer, PlaysToTheEndThenPausesAndPostsTheEndNotification) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("one", playback_test::oneSecond()));
    EndWatcher end(item);
    auto player = readyPlayer(item);
    EXPECT_EQ(player->actionAtItemEnd(), Player::ActionAtItemEnd::Pause);

    QList<MediaTime> ticks;
    bool ticksOnMain = true;
    player->addPeriodicTimeObserverForInterval_queue_usingBlock(kThirtieth, {}, [&](MediaTime t) {
        ticks.append(t);
        ticksOnMain = ticksOnMain && MainQueue::isCurrent();
    });
    player->play();
    EXPECT_EQ(player->rate(), 1.0f);
    ASSERT_TRUE(waitUntil([&] { return end.count() == 1; }, 15000));
    EXPECT_TRUE(end.onMainThread());
    EXPECT_EQ(player->rate(), 0.0f) << "the action at the end is to pause";

    // Near the end: within two frames of the item's duration.
    const double duration = item->duration().seconds();
    EXPECT_NEAR(player->currentTime().seconds(), duration, 2.0 / 30.0 + 1e-6);

    // About 30 ticks for one second of playback; generous bounds, as the
    // machine may be loaded. Their times never go backwards.
    EXPECT_GE(ticks.size(), 10);
    EXPECT_LE(ticks.size(), 80);
    EXPECT_TRUE(ticksOnMain);
    for (int i = 1; i < ticks.size(); ++i)
        EXPECT_GE(ticks[i], ticks[i - 1]);
    EXPECT_GT(ticks.last().seconds(), 0.5);

    // Stopped: no further ticks, no second notification.
    const auto count = ticks.size();
    waitUntil([] { return false; }, 300);
    EXPECT_LE(ticks.size(), count + 1);
    EXPECT_EQ(end.count(), 1);

    // Played while standing at the end, it ends again at once.
    player->play();
    ASSERT_TRUE(waitUntil([&] { return end.count() == 2; }, 5000));
    EXPECT_EQ(player->rate(), 0.0f);

    // Rewound and played again, it plays through and ends again.
    player->seekToTime(MediaTime::zero());
    EXPECT_EQ(player->currentTime(), MediaTime::zero());
    player->play();
    ASSERT_TRUE(waitUntil([&] { return player->currentTime().seconds() > 0.3; }, 5000));
    EXPECT_EQ(end.count(), 2);
    ASSERT_TRUE(waitUntil([&] { return end.count() == 3; }, 15000));
}

TEST(PlaybackPlayer, PeriodicObserverFollowsItsIntervalAndStopsWhenRemoved) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("two", playback_test::twoSeconds()));
    auto player = readyPlayer(item);
    int fast = 0, slow = 0;
    auto fastToken = player->addPeriodicTimeObserverForInterval_queue_usingBlock(
        MediaTime::fromSeconds(0.05, 1000), {}, [&](MediaTime) { ++fast; });
    player->addPeriodicTimeObserverForInterval_queue_usingBlock(MediaTime::fromSeconds(0.25, 1000),
                                                                {}, [&](MediaTime) { ++slow; });
    // Paused: nothing ticks.
    waitUntil([] { return false; }, 200);
    EXPECT_EQ(fast, 0);
    EXPECT_EQ(slow, 0);

    player->play();
    ASSERT_TRUE(waitUntil([&] { return slow >= 4; }, 10000));
    player->pause();
    // Four times the rate, give or take the start and stop ticks and a busy machine.
    EXPECT_GT(fast, 2 * slow);

    player->removeTimeObserver(fastToken);
    const int fastBefore = fast;
    player->play();
    ASSERT_TRUE(waitUntil([&] { return slow >= 7; }, 10000));
    EXPECT_EQ(fast, fastBefore);

    // Refused intervals give a null token.
    EXPECT_FALSE(player->addPeriodicTimeObserverForInterval_queue_usingBlock(MediaTime::zero(), {},
                                                                             [](MediaTime) {}));
    EXPECT_FALSE(player->addPeriodicTimeObserverForInterval_queue_usingBlock(MediaTime::invalid(),
                                                                             {}, [](MediaTime) {}));
}

TEST(PlaybackPlayer, ObserversCanRunOnAnotherQueue) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("one", playback_test::oneSecond()));
    auto player = readyPlayer(item);
    std::atomic<int> offMain{0}, onMain{0};
    auto worker = [](std::function<void()> job) {
        GlobalQueue::async(QueuePriority::Default, std::move(job));
    };
    player->addPeriodicTimeObserverForInterval_queue_usingBlock(kThirtieth, worker, [&](MediaTime) {
        (GlobalQueue::isWorkerThread() ? offMain : onMain)++;
    });
    player->play();
    ASSERT_TRUE(waitUntil([&] { return offMain.load() >= 3; }, 10000));
    player->pause();
    GlobalQueue::drain();
    EXPECT_EQ(onMain.load(), 0);
}

TEST(PlaybackPlayer, BoundaryObserverFiresWhenPlaybackReachesItsTime) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("two", playback_test::twoSeconds()));
    EndWatcher end(item);
    auto player = readyPlayer(item);
    const std::int32_t scale = player->currentTime().timescale;

    QList<double> firedAt;
    QList<double> endFiredAt;
    player->addBoundaryTimeObserverForTimes_queue_usingBlock(
        {MediaTime::fromSeconds(0.5, scale), MediaTime::fromSeconds(1.0, scale)}, {},
        [&] { firedAt.append(player->currentTime().seconds()); });
    // A time past the end fires when the end is reached.
    player->addBoundaryTimeObserverForTimes_queue_usingBlock(
        {MediaTime::fromSeconds(5.0, scale)}, {},
        [&] { endFiredAt.append(player->currentTime().seconds()); });
    // Jumped over by a seek: never fires.
    int jumped = 0;
    auto jumpedToken = player->addBoundaryTimeObserverForTimes_queue_usingBlock(
        {MediaTime::fromSeconds(0.2, scale)}, {}, [&] { ++jumped; });

    player->seekToTime_toleranceBefore_toleranceAfter(MediaTime::fromSeconds(0.3, scale),
                                                      MediaTime::zero(), MediaTime::zero());
    ASSERT_TRUE(waitUntil([&] { return !player->isSeeking(); }));
    player->play();
    ASSERT_TRUE(waitUntil([&] { return end.count() == 1; }, 15000));
    player->removeTimeObserver(jumpedToken);

    ASSERT_EQ(firedAt.size(), 2);
    // Near the time: at it or a few frames after.
    EXPECT_GE(firedAt[0], 0.5 - 1e-6);
    EXPECT_LT(firedAt[0], 0.5 + 0.25);
    EXPECT_GE(firedAt[1], 1.0 - 1e-6);
    EXPECT_LT(firedAt[1], 1.0 + 0.25);
    EXPECT_EQ(endFiredAt.size(), 1);
    EXPECT_EQ(jumped, 0);

    // Paused playback passes nothing, and a removed observer stays quiet.
    player->seekToTime(MediaTime::zero());
    waitUntil([] { return false; }, 300);
    EXPECT_EQ(firedAt.size(), 2);
}

TEST(PlaybackPlayer, ExactSeeksLandOnTheRequestedTime) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("two", playback_test::twoSeconds()));
    auto player = readyPlayer(item);
    const std::int32_t scale = player->currentTime().timescale;
    // Frames between keyframes, a keyframe, and backwards.
    for (int frame : {17, 45, 30, 3, 59}) {
        SCOPED_TRACE(frame);
        const MediaTime target = MediaTime::fromSeconds(frame / 30.0, scale);
        bool finished = false;
        player->seekToTime_toleranceBefore_toleranceAfter_completionHandler(
            target, MediaTime::zero(), MediaTime::zero(), [&](bool done) { finished = done; });
        EXPECT_EQ(player->currentTime(), target) << "the target is reported while seeking";
        ASSERT_TRUE(waitUntil([&] { return finished; }));
        EXPECT_EQ(player->currentTime(), target)
            << player->currentTime().description().toStdString();
        EXPECT_EQ(item->currentTime(), target);
    }
}

TEST(PlaybackPlayer, ASeekTakingAnotherSeeksPlaceReportsItUnfinished) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("two", playback_test::twoSeconds()));
    auto player = Player::playerWithPlayerItem(item);
    QList<bool> results;
    const MediaTime zero = MediaTime::zero();
    // Both made before the item has loaded: the later one wins and is applied
    // once it has.
    player->seekToTime_toleranceBefore_toleranceAfter_completionHandler(
        MediaTime::fromSeconds(0.5, 600), zero, zero, [&](bool done) { results.append(done); });
    player->seekToTime_toleranceBefore_toleranceAfter_completionHandler(
        MediaTime::fromSeconds(1.0, 600), zero, zero, [&](bool done) { results.append(done); });
    ASSERT_TRUE(waitUntil([&] { return results.size() == 2; }));
    EXPECT_EQ(results, (QList<bool>{false, true}));
    EXPECT_EQ(player->currentTime().seconds(), 1.0);

    // An invalid time, or a player without an item, refuses at once.
    bool refused = true;
    player->seekToTime_toleranceBefore_toleranceAfter_completionHandler(
        MediaTime::invalid(), zero, zero, [&](bool done) { refused = !done; });
    ASSERT_TRUE(waitUntil([&] { return refused; }));
    EXPECT_EQ(player->currentTime().seconds(), 1.0);
}

TEST(PlaybackPlayer, ActionAtItemEnd) {
    {
        auto item = PlayerItem::playerItemWithURL(clipUrl("one", playback_test::oneSecond()));
        EndWatcher end(item);
        auto player = readyPlayer(item);
        player->setActionAtItemEnd(Player::ActionAtItemEnd::None);
        player->play();
        ASSERT_TRUE(waitUntil([&] { return end.count() == 1; }, 15000));
        EXPECT_EQ(player->rate(), 1.0f);
        EXPECT_EQ(player->currentItem(), item);
    }
    {
        auto item = PlayerItem::playerItemWithURL(clipUrl("one", playback_test::oneSecond()));
        EndWatcher end(item);
        auto player = readyPlayer(item);
        player->setActionAtItemEnd(Player::ActionAtItemEnd::Advance);
        player->play();
        ASSERT_TRUE(waitUntil([&] { return end.count() == 1; }, 15000));
        EXPECT_EQ(player->currentItem(), nullptr);
        EXPECT_FALSE(player->currentTime().isValid());
    }
}

TEST(PlaybackPlayer, ReplacingTheItemPlaysTheNewOneOnly) {
    auto first = PlayerItem::playerItemWithURL(clipUrl("two", playback_test::twoSeconds()));
    auto second = PlayerItem::playerItemWithURL(clipUrl("one", playback_test::oneSecond()));
    EndWatcher firstEnd(first), secondEnd(second);
    auto player = readyPlayer(first);
    player->seekToTime(MediaTime::fromSeconds(1.5, 600));
    player->play();
    player->replaceCurrentItemWithPlayerItem(second);
    EXPECT_FALSE(first->currentTime().isValid());
    EXPECT_EQ(player->rate(), 1.0f) << "the rate carries over";
    ASSERT_EQ(waitForStatus(second), PlayerItem::Status::ReadyToPlay);
    ASSERT_TRUE(waitUntil([&] { return secondEnd.count() == 1; }, 15000));
    EXPECT_EQ(firstEnd.count(), 0);
    EXPECT_NEAR(player->currentTime().seconds(), second->duration().seconds(), 2.0 / 30.0 + 1e-6);
}

TEST(PlaybackPlayer, ReplacingAnItemStillLoadingLoadsOnlyTheNewOne) {
    // The first item is replaced at different points of its loading; the
    // events of its file must never be taken for the second's.
    for (int delayMs : {0, 2, 10, 30}) {
        SCOPED_TRACE(delayMs);
        auto first = PlayerItem::playerItemWithURL(clipUrl("two", playback_test::twoSeconds()));
        auto second = PlayerItem::playerItemWithURL(clipUrl("one", playback_test::oneSecond()));
        EndWatcher secondEnd(second);
        auto player = Player::playerWithPlayerItem(first);
        waitUntil([] { return false; }, delayMs);
        player->replaceCurrentItemWithPlayerItem(second);
        player->seekToTime_toleranceBefore_toleranceAfter(MediaTime::fromSeconds(0.5, 600),
                                                          MediaTime::zero(), MediaTime::zero());
        ASSERT_EQ(waitForStatus(second), PlayerItem::Status::ReadyToPlay);
        EXPECT_EQ(second->duration(), second->asset()->duration());
        ASSERT_TRUE(waitUntil([&] { return !player->isSeeking(); }));
        EXPECT_EQ(player->currentTime().seconds(), 0.5);
        player->play();
        ASSERT_TRUE(waitUntil([&] { return secondEnd.count() == 1; }, 15000));
        EXPECT_NEAR(player->currentTime().seconds(), second->duration().seconds(),
                    2.0 / 30.0 + 1e-6);
    }
}

TEST(PlaybackPlayer, DroppingAPlayerWhilePlayingIsQuiet) {
    auto item = PlayerItem::playerItemWithURL(clipUrl("two", playback_test::twoSeconds()));
    EndWatcher end(item);
    int ticks = 0;
    {
        auto player = readyPlayer(item);
        player->addPeriodicTimeObserverForInterval_queue_usingBlock(kThirtieth, {},
                                                                    [&](MediaTime) { ++ticks; });
        player->play();
        ASSERT_TRUE(waitUntil([&] { return ticks > 3; }));
    }
    const int atDrop = ticks;
    waitUntil([] { return false; }, 300);
    EXPECT_EQ(ticks, atDrop) << "ticks already queued stay quiet too";
    EXPECT_EQ(end.count(), 0);
    EXPECT_FALSE(item->currentTime().isValid());
}
