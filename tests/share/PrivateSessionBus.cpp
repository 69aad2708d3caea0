#include "PrivateSessionBus.h"

#include <QStandardPaths>

namespace testing_support {

PrivateSessionBus::PrivateSessionBus() {
    const QString program = QStandardPaths::findExecutable(QStringLiteral("dbus-daemon"));
    if (program.isEmpty())
        return;
    daemon_.start(program, {QStringLiteral("--session"), QStringLiteral("--nofork"),
                            QStringLiteral("--print-address")});
    if (!daemon_.waitForStarted(5000))
        return;
    while (daemon_.waitForReadyRead(5000)) {
        if (daemon_.canReadLine()) {
            address_ = QString::fromUtf8(daemon_.readLine()).trimmed();
            break;
        }
    }
}

PrivateSessionBus::~PrivateSessionBus() {
    for (const QString& name : std::as_const(names_))
        QDBusConnection::disconnectFromBus(name);
    daemon_.terminate();
    daemon_.waitForFinished(3000);
}

QDBusConnection PrivateSessionBus::connect(const QString& name) const {
    const_cast<PrivateSessionBus*>(this)->names_.append(name);
    return QDBusConnection::connectToBus(address_, name);
}

} // namespace testing_support
