#pragma once

#include <QByteArray>
#include <QMetaObject>
#include <QObject>
#include <QVariant>
#include <QVariantList>

#include <functional>

namespace platform {

// Methods whose implementation can be exchanged at run time, class by class.
// A class that lets an operation be replaced registers its own implementation
// under the operation's name and calls it through invoke(); exchanging the
// implementations of two classes' entries makes each class run the other's
// code from then on, with its own instances as receivers. Exchanging again
// swaps them back.
//
// An implementation receives the receiver and the arguments, and returns a
// value (an invalid QVariant for none).
//
// Threads: any; the table is serialised. Entries are per class, exactly: a
// subclass looks its own entry up first, then its superclasses'.
namespace MethodTable {

using Method = std::function<QVariant(QObject* receiver, const QVariantList& arguments)>;

// Sets `cls`'s own implementation of `name` (replacing one there).
void addMethod(const QMetaObject* cls, const QByteArray& name, Method method);

// Whether `cls` or a superclass has an implementation of `name`.
bool respondsTo(const QMetaObject* cls, const QByteArray& name);

// Exchanges the implementations of `name` held by `first` and `second`
// (each class's own entry). False, and nothing changes, when either class has
// no entry of its own.
bool exchangeImplementations(const QMetaObject* first, const QMetaObject* second,
                             const QByteArray& name);

// Runs the implementation of `name` that the receiver's class has now, with
// `receiver` as the receiver. An invalid QVariant when there is none.
QVariant invoke(QObject* receiver, const QByteArray& name, const QVariantList& arguments = {});

} // namespace MethodTable
} // namespace platform
