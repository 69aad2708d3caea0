#pragma once

#include <QString>
#include <QVariantMap>

namespace platform {

// Receives changes of an observed property ("status" of a player item).
// Called on the main thread. The change map holds "kind" (1: the value was
// set) and, when asked for with the options below, "new" and "old".
class KeyValueObserver {
  public:
    enum Options { New = 0x01, Old = 0x02, Initial = 0x04 };

    virtual ~KeyValueObserver() = default;
    virtual void observeValueForKeyPath_ofObject_change_context(const QString& keyPath,
                                                                const void* object,
                                                                const QVariantMap& change,
                                                                void* context) = 0;
};

} // namespace platform
