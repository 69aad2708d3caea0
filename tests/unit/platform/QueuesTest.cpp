#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/MainQueue.h"
#include "support/Wait.h"

#include <QCoreApplication>
#include <QThread>
#include <atomic>
#include <gtest/gtest.h>
#include <vector>

using namespace platform;
using testing_support::waitUntil;

namespace {
bool onMainThread() {
    return QThread::currentThread() == QCoreApplication::instance()->thread();
}
} // namespace

TEST(MainQueue, AsyncRunsOnTheMainThreadInOrderAndNeverInline) {
    std::vector<int> order;
    std::atomic<bool> allOnMain{true};
    GlobalQueue::async(QueuePriority::Default, [&] {
        for (int i = 0; i < 5; ++i)
            MainQueue::async([&, i] {
                allOnMain = allOnMain && onMainThread();
                order.push_back(i);
            });
    });
    MainQueue::async([&] { order.push_back(-1); });
    EXPECT_TRUE(order.empty()) << "queued from the main thread, it still waits its turn";
    ASSERT_TRUE(waitUntil([&] { return order.size() == 6; }));
    std::erase(order, -1);
    EXPECT_EQ(order, (std::vector<int>{0, 1, 2, 3, 4}));
    EXPECT_TRUE(allOnMain);
}

TEST(MainQueue, SyncBlocksTheWorkerUntilTheMainThreadHasRunTheJob) {
    std::atomic<int> value{0};
    std::atomic<bool> done{false};
    GlobalQueue::async(QueuePriority::Background, [&] {
        MainQueue::sync([&] { value = onMainThread() && MainQueue::isCurrent() ? 42 : -1; });
        done = value == 42;
    });
    ASSERT_TRUE(waitUntil([&] { return done.load(); }));
    bool ranInline = false;
    MainQueue::sync([&] { ranInline = true; });
    EXPECT_TRUE(ranInline);
}

TEST(GlobalQueue, JobsRunOnWorkersAndDrainWaitsForJobsThatQueueMoreOrWaitOnTheMainQueue) {
    std::atomic<int> ran{0};
    std::atomic<bool> anyOnMain{false}, syncedOnMain{false};
    for (auto priority : {QueuePriority::Background, QueuePriority::Default})
        for (int i = 0; i < 8; ++i)
            GlobalQueue::async(priority, [&] {
                anyOnMain = anyOnMain || onMainThread() || !GlobalQueue::isWorkerThread();
                QThread::msleep(5);
                GlobalQueue::async(QueuePriority::Background, [&] {
                    QThread::msleep(5);
                    ++ran;
                });
            });
    GlobalQueue::async(QueuePriority::Default,
                       [&] { MainQueue::sync([&] { syncedOnMain = onMainThread(); }); });
    GlobalQueue::drain();
    EXPECT_EQ(ran.load(), 16);
    EXPECT_FALSE(anyOnMain);
    EXPECT_TRUE(syncedOnMain);
    EXPECT_FALSE(GlobalQueue::isWorkerThread());
}
