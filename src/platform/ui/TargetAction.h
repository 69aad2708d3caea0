#pragma once

#include <QByteArray>
#include <QObject>

namespace platform {

// Target-action by name, through Qt's meta-object system: the action is the
// name of an invokable method or slot of the target. Main thread only.
namespace TargetAction {

// Whether `target` has a method named `action` that takes no argument or one
// object pointer.
bool respondsTo(const QObject* target, const QByteArray& action);

// Calls the target's method named `action`: the form with one object-pointer
// parameter (given `sender` when the sender is of that class) is preferred,
// then the form without parameters. Returns false, doing nothing, when the
// target is null or has no such method.
bool send(QObject* target, const QByteArray& action, QObject* sender);

} // namespace TargetAction
} // namespace platform
