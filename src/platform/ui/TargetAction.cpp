#include "platform/ui/TargetAction.h"

#include <QMetaMethod>

namespace platform::TargetAction {

namespace {

// The object class a parameter type names ("QWidget*" -> QWidget), or null.
const QMetaObject* pointeeClass(const QMetaMethod& method) {
    const QMetaType type = method.parameterMetaType(0);
    if (!(type.flags() & QMetaType::PointerToQObject))
        return nullptr;
    return type.metaObject();
}

struct Match {
    int withSender = -1;
    int withoutArguments = -1;
};

Match find(const QObject* target, const QByteArray& action, const QObject* sender) {
    Match match;
    if (!target || action.isEmpty())
        return match;
    const QMetaObject* meta = target->metaObject();
    for (int i = 0; i < meta->methodCount(); ++i) {
        const QMetaMethod method = meta->method(i);
        if (method.name() != action || method.methodType() == QMetaMethod::Constructor)
            continue;
        if (method.parameterCount() == 0 && match.withoutArguments < 0) {
            match.withoutArguments = i;
        } else if (method.parameterCount() == 1 && match.withSender < 0) {
            const QMetaObject* wanted = pointeeClass(method);
            if (wanted && (!sender || sender->metaObject()->inherits(wanted)))
                match.withSender = i;
        }
    }
    return match;
}

} // namespace

bool respondsTo(const QObject* target, const QByteArray& action) {
    const Match match = find(target, action, nullptr);
    return match.withSender >= 0 || match.withoutArguments >= 0;
}

bool send(QObject* target, const QByteArray& action, QObject* sender) {
    const Match match = find(target, action, sender);
    if (match.withSender >= 0) {
        const QMetaMethod method = target->metaObject()->method(match.withSender);
        // QObject is the first base of every QObject class, so the pointer
        // has the same value whichever of those classes the slot names.
        void* argument = sender;
        return method.invoke(
            target, Qt::DirectConnection,
            QGenericArgument(method.parameterTypes().value(0).constData(), &argument));
    }
    if (match.withoutArguments >= 0)
        return target->metaObject()
            ->method(match.withoutArguments)
            .invoke(target, Qt::DirectConnection);
    return false;
}

} // namespace platform::TargetAction
