#include "platform/media/playback/Player.h"
#include "PlaybackFixture.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/MainQueue.h"
#include "support/Wait.h"

#include <gtest/gtest.h>

#include <atomic>

using namespace platform;
using namespace playback_test;
using testing_support::waitUntil;

namespace {
// The interval the editor's playhead observer uses.
const MediaTime kThirtieth = MediaTime::fromSeconds(1.0 / 30.0, 1000000000);
const double kTwoFrames = 2.0 / 30.0 + 1e-6;
void idle(int ms) {
    waitUntil([] { return false; }, ms);
}
} // namespace

TEST(PlaybackPlayer, PlaysToTheEndTickingOnEachObserversQueueThenPausesAndPostsTheEnd) {
    auto item = PlayerItem::playerItemWithURL(clip(1));
    EndWatcher end(item);
    auto player = readyPlayer(item);
    EXPECT_EQ(player->actionAtItemEnd(), Player::ActionAtItemEnd::Pause);

    QList<MediaTime> ticks;
    bool ticksOnMain = true;
    int slow = 0, removed = 0;
    std::atomic<int> onWorker{0}, workerOnMain{0};
    player->addPeriodicTimeObserverForInterval_queue_usingBlock(kThirtieth, {}, [&](MediaTime t) {
        ticks.append(t);
        ticksOnMain = ticksOnMain && MainQueue::isCurrent();
    });
    player->addPeriodicTimeObserverForInterval_queue_usingBlock(MediaTime::fromSeconds(0.25, 1000),
                                                                {}, [&](MediaTime) { ++slow; });
    player->removeTimeObserver(player->addPeriodicTimeObserverForInterval_queue_usingBlock(
        kThirtieth, {}, [&](MediaTime) { ++removed; }));
    player->addPeriodicTimeObserverForInterval_queue_usingBlock(
        kThirtieth, [](auto job) { GlobalQueue::async(QueuePriority::Default, std::move(job)); },
        [&](MediaTime) { (GlobalQueue::isWorkerThread() ? onWorker : workerOnMain)++; });
    // Refused intervals give a null token.
    EXPECT_FALSE(player->addPeriodicTimeObserverForInterval_queue_usingBlock(MediaTime::zero(), {},
                                                                             [](MediaTime) {}));
    idle(200);
    EXPECT_TRUE(ticks.isEmpty()) << "paused: nothing ticks";

    player->play();
    EXPECT_EQ(player->rate(), 1.0f);
    ASSERT_TRUE(end.waitFor(1));
    EXPECT_EQ(player->rate(), 0.0f) << "the action at the end is to pause";
    EXPECT_NEAR(player->currentTime().seconds(), item->duration().seconds(), kTwoFrames);

    // About 30 ticks for one second; generous bounds, as the machine may be
    // loaded. Their times never go backwards.
    EXPECT_GE(ticks.size(), 10);
    EXPECT_LE(ticks.size(), 80);
    EXPECT_TRUE(ticksOnMain);
    EXPECT_TRUE(std::is_sorted(ticks.begin(), ticks.end()));
    EXPECT_GT(ticks.last().seconds(), 0.5);
    EXPECT_GT(ticks.size(), 2 * slow) << "each observer keeps its own interval";
    EXPECT_EQ(removed, 0);
    GlobalQueue::drain();
    EXPECT_GE(onWorker.load(), 3);
    EXPECT_EQ(workerOnMain.load(), 0);

    // Stopped: no further ticks, no second notification.
    const auto count = ticks.size();
    idle(300);
    EXPECT_LE(ticks.size(), count + 1);
    EXPECT_EQ(end.count(), 1);

    // Played while standing at the end, it ends again at once; rewound, it
    // plays through and ends again.
    player->play();
    ASSERT_TRUE(end.waitFor(2));
    EXPECT_EQ(player->rate(), 0.0f);
    player->seekToTime(MediaTime::zero());
    EXPECT_EQ(player->currentTime(), MediaTime::zero());
    player->play();
    ASSERT_TRUE(waitUntil([&] { return player->currentTime().seconds() > 0.3; }));
    EXPECT_EQ(end.count(), 2);
    ASSERT_TRUE(end.waitFor(3));
}

TEST(PlaybackPlayer, BoundaryObserverFiresWhenPlaybackReachesItsTime) {
    auto item = PlayerItem::playerItemWithURL(clip(2));
    EndWatcher end(item);
    auto player = readyPlayer(item);
    const std::int32_t scale = player->currentTime().timescale;
    const auto at = [&](double s) { return MediaTime::fromSeconds(s, scale); };

    QList<double> firedAt, endFiredAt;
    int jumped = 0;
    player->addBoundaryTimeObserverForTimes_queue_usingBlock(
        {at(0.5), at(1.0)}, {}, [&] { firedAt.append(player->currentTime().seconds()); });
    // A time past the end fires when the end is reached; one a seek jumps
    // over never fires.
    player->addBoundaryTimeObserverForTimes_queue_usingBlock(
        {at(5.0)}, {}, [&] { endFiredAt.append(player->currentTime().seconds()); });
    auto jumpedToken =
        player->addBoundaryTimeObserverForTimes_queue_usingBlock({at(0.2)}, {}, [&] { ++jumped; });

    player->seekToTime_toleranceBefore_toleranceAfter(at(0.3), MediaTime::zero(),
                                                      MediaTime::zero());
    ASSERT_TRUE(waitUntil([&] { return !player->isSeeking(); }));
    player->play();
    ASSERT_TRUE(end.waitFor(1));
    player->removeTimeObserver(jumpedToken);

    // Near the time: at it or a few frames after.
    ASSERT_EQ(firedAt.size(), 2);
    EXPECT_TRUE(firedAt[0] >= 0.5 - 1e-6 && firedAt[0] < 0.75) << firedAt[0];
    EXPECT_TRUE(firedAt[1] >= 1.0 - 1e-6 && firedAt[1] < 1.25) << firedAt[1];
    EXPECT_EQ(endFiredAt.size(), 1);
    EXPECT_EQ(jumped, 0);

    // A seek back while paused passes nothing.
    player->seekToTime(MediaTime::zero());
    idle(300);
    EXPECT_EQ(firedAt.size(), 2);
}

TEST(PlaybackPlayer, ReplacingTheItemLoadingOrPlayingPlaysOnlyTheNewOne) {
    // Replaced at different points of its loading, or while it plays: the
    // events of the first file must never be taken for the second's.
    for (int delayMs : {0, 2, 10, 30, -1}) {
        SCOPED_TRACE(delayMs);
        auto first = PlayerItem::playerItemWithURL(clip(2));
        auto second = PlayerItem::playerItemWithURL(clip(1));
        EndWatcher firstEnd(first), secondEnd(second);
        auto player = Player::playerWithPlayerItem(first);
        if (delayMs < 0) {
            ASSERT_EQ(waitForStatus(first), PlayerItem::Status::ReadyToPlay);
            player->seekToTime(MediaTime::fromSeconds(1.5, 600));
            player->play();
        }
        idle(std::max(delayMs, 0));
        player->replaceCurrentItemWithPlayerItem(second);
        EXPECT_FALSE(first->currentTime().isValid());
        EXPECT_EQ(player->rate(), delayMs < 0 ? 1.0f : 0.0f) << "the rate carries over";
        player->pause();
        player->seekToTime_toleranceBefore_toleranceAfter(MediaTime::fromSeconds(0.5, 600),
                                                          MediaTime::zero(), MediaTime::zero());
        ASSERT_EQ(waitForStatus(second), PlayerItem::Status::ReadyToPlay);
        EXPECT_EQ(second->duration(), second->asset()->duration());
        ASSERT_TRUE(waitUntil([&] { return !player->isSeeking(); }));
        EXPECT_EQ(player->currentTime().seconds(), 0.5);
        player->play();
        ASSERT_TRUE(secondEnd.waitFor(1));
        EXPECT_NEAR(player->currentTime().seconds(), second->duration().seconds(), kTwoFrames);
        EXPECT_EQ(firstEnd.count(), 0);
    }
}

TEST(PlaybackPlayer, DroppingAPlayerWhilePlayingIsQuiet) {
    auto item = PlayerItem::playerItemWithURL(clip(2));
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
    idle(300);
    EXPECT_EQ(ticks, atDrop) << "ticks already queued stay quiet too";
    EXPECT_EQ(end.count(), 0);
    EXPECT_FALSE(item->currentTime().isValid());
}
