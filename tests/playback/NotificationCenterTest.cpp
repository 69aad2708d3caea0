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
using testing_support::waitUntil;

namespace {

const QString kEnd = QStringLiteral("End");
const QString kStart = QStringLiteral("Start");

// Records what each handler saw, as "observer:name".
struct Journal {
    QStringList entries;
    NotificationCenter::Handler handler(const QString& who) {
        return [this, who](const Notification& n) { entries.append(who + u':' + n.name); };
    }
};

} // namespace

TEST(PlaybackNotificationCenter, MatchesByNameAndObject) {
    NotificationCenter centre;
    Journal journal;
    int itemA = 0, itemB = 0, anyone = 0, onlyA = 0, everything = 0;
    centre.addObserver(&anyone, kEnd, nullptr, journal.handler("any"));
    centre.addObserver(&onlyA, kEnd, &itemA, journal.handler("a"));
    centre.addObserver(&everything, QString(), nullptr, journal.handler("all"));

    centre.post(kEnd, &itemA);
    centre.post(kEnd, &itemB);
    centre.post(kStart, &itemA);

    EXPECT_EQ(journal.entries,
              (QStringList{"any:End", "a:End", "all:End", "any:End", "all:End", "all:Start"}));
}

TEST(PlaybackNotificationCenter, RemovesPerObserverAndPerName) {
    NotificationCenter centre;
    Journal journal;
    int item = 0, first = 0, second = 0;
    centre.addObserver(&first, kEnd, &item, journal.handler("first"));
    centre.addObserver(&first, kStart, &item, journal.handler("first"));
    centre.addObserver(&second, kEnd, &item, journal.handler("second"));
    centre.addObserver(&second, kStart, nullptr, journal.handler("second"));

    centre.removeObserver(&second, kEnd);
    centre.post(kEnd, &item);
    centre.post(kStart, &item);
    EXPECT_EQ(journal.entries, (QStringList{"first:End", "first:Start", "second:Start"}));

    journal.entries.clear();
    centre.removeObserver(&first);
    centre.post(kEnd, &item);
    centre.post(kStart, &item);
    EXPECT_EQ(journal.entries, (QStringList{"second:Start"}));

    // Removal for one object leaves registrations for any object alone.
    int other = 0;
    centre.removeObserver(&second, kStart, &other);
    EXPECT_EQ(centre.observerCount(), 1);
    centre.removeObserver(&second, QString(), nullptr);
    EXPECT_EQ(centre.observerCount(), 0);
}

TEST(PlaybackNotificationCenter, HandlersMayRemoveObserversDuringDelivery) {
    NotificationCenter centre;
    Journal journal;
    int first = 0, second = 0;
    centre.addObserver(&first, kEnd, nullptr, [&](const Notification&) {
        journal.entries.append("first");
        centre.removeObserver(&first);
        centre.removeObserver(&second);
    });
    centre.addObserver(&second, kEnd, nullptr, journal.handler("second"));
    centre.post(kEnd, nullptr);
    centre.post(kEnd, nullptr);
    EXPECT_EQ(journal.entries, (QStringList{"first"}));
}

TEST(PlaybackNotificationCenter, PostsFromWorkersArriveOnTheMainThread) {
    NotificationCenter centre;
    int observer = 0, removedLater = 0;
    std::atomic<int> posted{0};
    int delivered = 0;
    bool allOnMain = true;
    int lateDeliveries = 0;
    centre.addObserver(&observer, kEnd, nullptr, [&](const Notification& n) {
        ++delivered;
        allOnMain = allOnMain && platform::MainQueue::isCurrent();
        EXPECT_EQ(n.userInfo.value("index").toInt() >= 0, true);
    });
    centre.addObserver(&removedLater, kEnd, nullptr,
                       [&](const Notification&) { ++lateDeliveries; });

    for (int i = 0; i < 4; ++i) {
        platform::GlobalQueue::async(platform::QueuePriority::Default, [&, i] {
            centre.post(kEnd, nullptr, {{"index", i}});
            ++posted;
        });
    }
    // Waits without turning the main loop, so nothing is delivered yet.
    for (int i = 0; i < 5000 && posted.load() < 4; ++i)
        QThread::msleep(1);
    ASSERT_EQ(posted.load(), 4);
    // Everything is queued to the main loop by now; removing an observer
    // before the loop runs must keep it from being called.
    centre.removeObserver(&removedLater);
    EXPECT_TRUE(waitUntil([&] { return delivered == 4; }, 5000));
    EXPECT_TRUE(allOnMain);
    EXPECT_EQ(lateDeliveries, 0);
}
