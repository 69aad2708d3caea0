#include "platform/runtime/MethodTable.h"

#include <QHash>
#include <QPair>
#include <mutex>

namespace platform::MethodTable {

namespace {
using Key = QPair<const QMetaObject*, QByteArray>;

struct Table {
    std::mutex mutex;
    QHash<Key, Method> methods;
};

Table& table() {
    static Table shared;
    return shared;
}

// The entry that `cls` answers `name` with: its own, else its nearest
// superclass's. Called with the table locked.
Method lookUp(Table& t, const QMetaObject* cls, const QByteArray& name) {
    for (; cls; cls = cls->superClass()) {
        const auto found = t.methods.constFind(Key(cls, name));
        if (found != t.methods.constEnd())
            return *found;
    }
    return {};
}
} // namespace

void addMethod(const QMetaObject* cls, const QByteArray& name, Method method) {
    Table& t = table();
    std::lock_guard lock(t.mutex);
    t.methods.insert(Key(cls, name), std::move(method));
}

bool respondsTo(const QMetaObject* cls, const QByteArray& name) {
    Table& t = table();
    std::lock_guard lock(t.mutex);
    return bool(lookUp(t, cls, name));
}

bool exchangeImplementations(const QMetaObject* first, const QMetaObject* second,
                             const QByteArray& name) {
    Table& t = table();
    std::lock_guard lock(t.mutex);
    auto a = t.methods.find(Key(first, name));
    auto b = t.methods.find(Key(second, name));
    if (a == t.methods.end() || b == t.methods.end())
        return false;
    std::swap(*a, *b);
    return true;
}

QVariant invoke(QObject* receiver, const QByteArray& name, const QVariantList& arguments) {
    if (!receiver)
        return {};
    Method method;
    {
        Table& t = table();
        std::lock_guard lock(t.mutex);
        method = lookUp(t, receiver->metaObject(), name);
    }
    // Run outside the lock: the method may itself use the table.
    return method ? method(receiver, arguments) : QVariant();
}

} // namespace platform::MethodTable
