#include "NotificationCenter.h"

#include "platform/runtime/MainQueue.h"

#include <algorithm>

namespace platform {

NotificationCenter& NotificationCenter::defaultCenter() {
    // Never destroyed: deliveries queued at exit must not find it gone.
    static NotificationCenter* centre = new NotificationCenter;
    return *centre;
}

void NotificationCenter::addObserver(const void* observer, const QString& name, const void* object,
                                     Handler handler) {
    if (!handler)
        return;
    std::lock_guard lock(mutex_);
    registrations_.append(
        {nextId_++, observer, name, object, std::make_shared<Handler>(std::move(handler))});
}

void NotificationCenter::removeObserver(const void* observer) {
    std::lock_guard lock(mutex_);
    registrations_.removeIf([&](const Registration& r) { return r.observer == observer; });
}

void NotificationCenter::removeObserver(const void* observer, const QString& name,
                                        const void* object) {
    std::lock_guard lock(mutex_);
    registrations_.removeIf([&](const Registration& r) {
        return r.observer == observer && (name.isEmpty() || r.name == name) &&
               (!object || r.object == object);
    });
}

void NotificationCenter::post(const QString& name, const void* object,
                              const QVariantMap& userInfo) {
    post(Notification{name, object, userInfo});
}

void NotificationCenter::post(const Notification& notification) {
    if (MainQueue::isCurrent()) {
        deliver(notification);
        return;
    }
    std::weak_ptr<NotificationCenter*> alive = self_;
    MainQueue::async([alive, notification] {
        if (auto self = alive.lock())
            (*self)->deliver(notification);
    });
}

void NotificationCenter::deliver(const Notification& notification) {
    // The matching set is taken first and each registration re-checked just
    // before its call, so a handler may add or remove observers (itself
    // included) without disturbing this delivery.
    QList<std::pair<std::uint64_t, std::shared_ptr<Handler>>> matching;
    {
        std::lock_guard lock(mutex_);
        for (const Registration& r : registrations_) {
            if ((r.name.isEmpty() || r.name == notification.name) &&
                (!r.object || r.object == notification.object))
                matching.append({r.id, r.handler});
        }
    }
    for (const auto& [id, handler] : matching) {
        if (isRegistered(id))
            (*handler)(notification);
    }
}

bool NotificationCenter::isRegistered(std::uint64_t id) const {
    std::lock_guard lock(mutex_);
    return std::any_of(registrations_.begin(), registrations_.end(),
                       [id](const Registration& r) { return r.id == id; });
}

int NotificationCenter::observerCount() const {
    std::lock_guard lock(mutex_);
    return int(registrations_.size());
}

} // namespace platform
