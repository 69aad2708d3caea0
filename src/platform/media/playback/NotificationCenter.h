#pragma once

#include "platform/media/playback/Notification.h"

#include <QList>
#include <QString>

#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>

namespace platform {

// Delivers named notifications to the observers registered for them.
//
// Threads: every method may be called from any thread. Handlers always run on
// the main thread: a post made on the main thread is delivered before post()
// returns; a post from another thread is queued to the main queue. An
// observer removed before its delivery runs is not called, even for a post
// that was already queued.
//
// Ownership: the centre keeps the handler (and what it captures) until the
// observer is removed; `observer` is only an identity for removal and is never
// dereferenced, so a handler that needs its target should capture it weakly.
class NotificationCenter {
  public:
    using Handler = std::function<void(const Notification&)>;

    NotificationCenter() = default;
    NotificationCenter(const NotificationCenter&) = delete;
    NotificationCenter& operator=(const NotificationCenter&) = delete;

    // The process-wide centre that the player posts to.
    static NotificationCenter& defaultCenter();

    // Calls `handler` for every notification named `name` (an empty name
    // matches every name) whose object is `object` (null matches every
    // object). The same observer may register several times; each
    // registration is called.
    void addObserver(const void* observer, const QString& name, const void* object,
                     Handler handler);

    // Removes every registration of `observer`.
    void removeObserver(const void* observer);
    // Removes the registrations of `observer` for `name` (empty: any name)
    // and `object` (null: any object).
    void removeObserver(const void* observer, const QString& name, const void* object = nullptr);

    void post(const Notification& notification);
    void post(const QString& name, const void* object, const QVariantMap& userInfo = {});

    // How many registrations there are (for diagnostics and tests).
    int observerCount() const;

  private:
    struct Registration {
        std::uint64_t id;
        const void* observer;
        QString name;
        const void* object;
        std::shared_ptr<Handler> handler;
    };

    void deliver(const Notification& notification);
    bool isRegistered(std::uint64_t id) const;

    mutable std::mutex mutex_;
    QList<Registration> registrations_;
    std::uint64_t nextId_ = 1;
    // Lets queued deliveries find out whether the centre still exists.
    std::shared_ptr<NotificationCenter*> self_ = std::make_shared<NotificationCenter*>(this);
};

} // namespace platform
