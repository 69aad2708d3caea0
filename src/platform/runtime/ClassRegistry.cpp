#include "platform/runtime/ClassRegistry.h"

#include "platform/runtime/Log.h"

#include <QHash>
#include <mutex>

namespace platform::ClassRegistry {

namespace {
struct Registry {
    std::mutex mutex;
    QHash<QString, const QMetaObject*> classes;
};

Registry& registry() {
    static Registry shared;
    return shared;
}
} // namespace

bool registerClass(const QMetaObject* metaObject) {
    if (!metaObject)
        return false;
    const QString name = QString::fromLatin1(metaObject->className());
    Registry& r = registry();
    std::lock_guard lock(r.mutex);
    if (r.classes.contains(name)) {
        logError(QStringLiteral("ClassRegistry: %1 is already registered").arg(name));
        return false;
    }
    r.classes.insert(name, metaObject);
    return true;
}

const QMetaObject* classNamed(const QString& name) {
    Registry& r = registry();
    std::lock_guard lock(r.mutex);
    return r.classes.value(name, nullptr);
}

} // namespace platform::ClassRegistry
