#include "platform/media/playback/NotificationCenter.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/MainQueue.h"
#include "support/Wait.h"

#include <QStringList>
#include <QThread>

#include <gtest/gtest.h>

#include <atomic>

using platform::Notification;
using platform::NotificationCenter;

namespace {
const QString kEnd = QStringLiteral("End");
const QString kStart = QStringLiteral("Start");
} // namespace

TEST(PlaybackNotificationCenter, MatchesByNameAndObjectUntilTheObserverIsRemoved) {
    NotificationCenter centre;
    QStringList seen;
    int itemA = 0, itemB = 0, anyone = 0, onlyA = 0;
    centre.addObserver(&anyone, kEnd, nullptr, [&](const Notification&) { seen << "any"; });
    centre.addObserver(&onlyA, kEnd, &itemA, [&](const Notification&) { seen << "a"; });
    centre.post(kEnd, &itemA);
    centre.post(kEnd, &itemB);
    centre.post(kStart, &itemA);
    EXPECT_EQ(seen, (QStringList{"any", "a", "any"}));
    centre.removeObserver(&onlyA);
    seen.clear();
    centre.post(kEnd, &itemA);
    EXPECT_EQ(seen, QStringList{"any"});
    EXPECT_EQ(centre.observerCount(), 1);
}

TEST(PlaybackNotificationCenter, HandlersMayRemoveObserversDuringDelivery) {
    NotificationCenter centre;
    int first = 0, second = 0, calls = 0;
    centre.addObserver(&first, kEnd, nullptr, [&](const Notification&) {
        ++calls;
        centre.removeObserver(&first);
        centre.removeObserver(&second);
    });
    centre.addObserver(&second, kEnd, nullptr, [&](const Notification&) { calls += 10; });
    centre.post(kEnd, nullptr);
    centre.post(kEnd, nullptr);
    EXPECT_EQ(calls, 1);
}

TEST(PlaybackNotificationCenter, PostsFromWorkersArriveOnTheMainThread) {
    NotificationCenter centre;
    int observer = 0, removedLater = 0, delivered = 0, lateDeliveries = 0;
    std::atomic<int> posted{0};
    centre.addObserver(&observer, kEnd, nullptr, [&](const Notification& n) {
        ++delivered;
        EXPECT_TRUE(platform::MainQueue::isCurrent());
        EXPECT_TRUE(n.userInfo.contains("index"));
    });
    centre.addObserver(&removedLater, kEnd, nullptr,
                       [&](const Notification&) { ++lateDeliveries; });
    for (int i = 0; i < 4; ++i)
        platform::GlobalQueue::async(platform::QueuePriority::Default, [&, i] {
            centre.post(kEnd, nullptr, {{"index", i}});
            ++posted;
        });
    // Waits without turning the main loop, so nothing is delivered yet.
    for (int i = 0; i < 5000 && posted.load() < 4; ++i)
        QThread::msleep(1);
    ASSERT_EQ(posted.load(), 4);
    // Everything is queued to the main loop by now; removing an observer
    // before the loop runs must keep it from being called.
    centre.removeObserver(&removedLater);
    EXPECT_TRUE(testing_support::waitUntil([&] { return delivered == 4; }, 5000));
    EXPECT_EQ(lateDeliveries, 0);
}
