#include "GlobalQueue.h"

#include "MainQueue.h"

#include <QCoreApplication>
#include <QThread>
#include <QThreadPool>

namespace platform::GlobalQueue {
namespace {

thread_local bool onWorker = false;

// The pools are never destroyed: a job still running at static destruction
// time must not find its pool gone. drain() is the orderly way out.
QThreadPool* pool(QueuePriority priority) {
    static QThreadPool* background = [] {
        auto* p = new QThreadPool;
        p->setThreadPriority(QThread::LowPriority);
        p->setMaxThreadCount(qMax(2, QThread::idealThreadCount()));
        return p;
    }();
    static QThreadPool* normal = [] {
        auto* p = new QThreadPool;
        p->setMaxThreadCount(qMax(4, QThread::idealThreadCount()));
        return p;
    }();
    return priority == QueuePriority::Background ? background : normal;
}

} // namespace

void async(QueuePriority priority, std::function<void()> job) {
    pool(priority)->start([job = std::move(job)]() mutable {
        onWorker = true;
        job();
        job = nullptr; // captured objects are released on the worker, as queued work is
    });
}

void drain() {
    // A job may queue another on either pool, so wait until both stay idle.
    // On the main thread the loop keeps turning meanwhile: a job may be
    // waiting for the main queue to run something for it.
    const bool onMain = MainQueue::isCurrent();
    for (;;) {
        bool idle = true;
        for (auto priority : {QueuePriority::Background, QueuePriority::Default})
            idle = pool(priority)->waitForDone(onMain ? 10 : -1) && idle;
        if (onMain)
            QCoreApplication::processEvents(QEventLoop::AllEvents);
        if (idle && pool(QueuePriority::Background)->activeThreadCount() == 0 &&
            pool(QueuePriority::Default)->activeThreadCount() == 0)
            return;
    }
}

bool isWorkerThread() {
    return onWorker;
}

} // namespace platform::GlobalQueue
