#pragma once

#include <QMetaObject>
#include <QObject>
#include <QString>

#include <memory>

namespace platform {

// Classes looked up by name, through Qt's meta-object system: a plug-in
// registers the classes it brings when it is loaded, and whoever knows a
// class's name can then find it and make an instance without linking to it.
//
// Threads: any; registration and lookup are serialised. A class stays
// registered for the life of the process (a plug-in is never unloaded).
namespace ClassRegistry {

// Registers `metaObject` under its class name. A second registration of the
// same name is refused (false) and logged.
bool registerClass(const QMetaObject* metaObject);

// The class registered under `name`, or null.
const QMetaObject* classNamed(const QString& name);

// A new instance of the class made with its plain Q_INVOKABLE constructor,
// held by a shared_ptr, or null when the class has no such constructor or
// is not a `T`.
template <typename T> std::shared_ptr<T> makeInstance(const QMetaObject* metaObject) {
    if (!metaObject)
        return nullptr;
    QObject* object = metaObject->newInstance();
    if (!object)
        return nullptr;
    T* instance = qobject_cast<T*>(object);
    if (!instance) {
        delete object;
        return nullptr;
    }
    return std::shared_ptr<T>(instance, [](T* made) { made->deleteLater(); });
}

} // namespace ClassRegistry
} // namespace platform
