#include "FileHolds.h"

#include <QDir>
#include <QHash>
#include <condition_variable>
#include <mutex>

namespace platform::FileHolds {
namespace {

std::mutex mutex;
std::condition_variable released;
QHash<QString, int> holds; // path -> number of holds

} // namespace

std::shared_ptr<void> hold(const QString& hostPath) {
    const QString key = QDir::cleanPath(hostPath);
    {
        std::lock_guard lock(mutex);
        ++holds[key];
    }
    return std::shared_ptr<void>(nullptr, [key](void*) {
        {
            std::lock_guard lock(mutex);
            if (--holds[key] == 0)
                holds.remove(key);
        }
        released.notify_all();
    });
}

void waitForRelease(const QString& hostPath) {
    const QString key = QDir::cleanPath(hostPath);
    std::unique_lock lock(mutex);
    released.wait(lock, [&] { return !holds.contains(key); });
}

} // namespace platform::FileHolds
