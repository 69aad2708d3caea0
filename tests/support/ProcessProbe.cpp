#include "ProcessProbe.h"

#include <QElapsedTimer>
#include <QFile>
#include <QList>
#include <QThread>

namespace testing_support {

qint64 childOf(qint64 parent) {
    QFile children(QStringLiteral("/proc/%1/task/%1/children").arg(parent));
    if (!children.open(QIODevice::ReadOnly))
        return 0;
    return children.readAll().trimmed().split(' ').first().toLongLong();
}

bool processEnded(qint64 pid) {
    QFile status(QStringLiteral("/proc/%1/status").arg(pid));
    if (!status.open(QIODevice::ReadOnly))
        return true;
    return status.readAll().contains("State:\tZ");
}

bool pollUntil(const std::function<bool()>& condition, int timeoutMs, int intervalMs) {
    QElapsedTimer clock;
    clock.start();
    while (!condition()) {
        if (clock.elapsed() > timeoutMs)
            return condition();
        QThread::msleep(intervalMs);
    }
    return true;
}

} // namespace testing_support
