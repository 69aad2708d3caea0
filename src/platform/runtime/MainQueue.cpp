#include "MainQueue.h"

#include "Log.h"

#include <QCoreApplication>
#include <QEvent>
#include <QMetaObject>
#include <QThread>

namespace platform::MainQueue {

void async(std::function<void()> job) {
    QCoreApplication* app = QCoreApplication::instance();
    if (!app) {
        logError(QStringLiteral("main queue: no application, job dropped"));
        return;
    }
    QMetaObject::invokeMethod(app, std::move(job), Qt::QueuedConnection);
}

void sync(const std::function<void()>& job) {
    if (isCurrent()) {
        job();
        return;
    }
    QCoreApplication* app = QCoreApplication::instance();
    if (!app) {
        logError(QStringLiteral("main queue: no application, job dropped"));
        return;
    }
    QMetaObject::invokeMethod(app, job, Qt::BlockingQueuedConnection);
}

void runPending(int rounds) {
    if (!isCurrent())
        return;
    for (int round = 0; round < rounds; ++round) {
        QCoreApplication::sendPostedEvents();
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    }
}

bool isCurrent() {
    QCoreApplication* app = QCoreApplication::instance();
    return app && QThread::currentThread() == app->thread();
}

} // namespace platform::MainQueue
