#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/MainQueue.h"
#include "support/Wait.h"

#include <QCoreApplication>
#include <QThread>
#include <atomic>
#include <gtest/gtest.h>
#include <mutex>
#include <vector>

using namespace platform;
using testing_support::waitUntil;

namespace {
QThread* mainThread() {
    return QCoreApplication::instance()->thread();
}
} // namespace

TEST(MainQueue, AsyncFromAWorkerRunsOnTheMainThreadInOrder) {
    std::vector<int> order;
    std::atomic<bool> allOnMain{true};
    GlobalQueue::async(QueuePriority::Default, [&] {
        for (int i = 0; i < 5; ++i)
            MainQueue::async([&, i] {
                allOnMain = allOnMain && QThread::currentThread() == mainThread();
                order.push_back(i);
            });
    });
    ASSERT_TRUE(waitUntil([&] { return order.size() == 5; }));
    EXPECT_EQ(order, (std::vector<int>{0, 1, 2, 3, 4}));
    EXPECT_TRUE(allOnMain);
}

TEST(MainQueue, AsyncOnTheMainThreadNeverRunsInline) {
    bool ran = false;
    MainQueue::async([&] { ran = true; });
    EXPECT_FALSE(ran);
    EXPECT_TRUE(waitUntil([&] { return ran; }));
}

TEST(MainQueue, SyncBlocksTheWorkerUntilTheMainThreadHasRunTheJob) {
    std::atomic<bool> sawResult{false};
    std::atomic<bool> done{false};
    GlobalQueue::async(QueuePriority::Background, [&] {
        int value = 0;
        MainQueue::sync([&] {
            EXPECT_TRUE(MainQueue::isCurrent());
            value = 42;
        });
        sawResult = value == 42;
        done = true;
    });
    ASSERT_TRUE(waitUntil([&] { return done.load(); }));
    EXPECT_TRUE(sawResult);

    bool inline_ = false;
    MainQueue::sync([&] { inline_ = true; });
    EXPECT_TRUE(inline_);
}

TEST(GlobalQueue, JobsRunOnWorkersAndDrainWaitsForJobsThatQueueMore) {
    std::atomic<int> ran{0};
    std::atomic<bool> anyOnMain{false};
    for (auto priority : {QueuePriority::Background, QueuePriority::Default}) {
        for (int i = 0; i < 8; ++i)
            GlobalQueue::async(priority, [&] {
                anyOnMain = anyOnMain || QThread::currentThread() == mainThread() ||
                            !GlobalQueue::isWorkerThread();
                QThread::msleep(5);
                GlobalQueue::async(QueuePriority::Background, [&] {
                    QThread::msleep(5);
                    ++ran;
                });
            });
    }
    GlobalQueue::drain();
    EXPECT_EQ(ran.load(), 16);
    EXPECT_FALSE(anyOnMain);
    EXPECT_FALSE(GlobalQueue::isWorkerThread());
}

TEST(GlobalQueue, DrainOnTheMainThreadLetsJobsWaitOnTheMainQueue) {
    std::atomic<bool> ranOnMain{false};
    GlobalQueue::async(QueuePriority::Default,
                       [&] { MainQueue::sync([&] { ranOnMain = MainQueue::isCurrent(); }); });
    GlobalQueue::drain();
    EXPECT_TRUE(ranOnMain);
}
