#pragma once

#include <QString>
#include <QStringList>

namespace platform {

// What one side of an auxiliary connection offers: a protocol's name and the
// selectors of its methods. A proxy refuses to send what the other side's
// description does not list.
struct InterfaceDescription {
    QString protocolName;
    QStringList selectors;

    static InterfaceDescription interfaceWithProtocol(const QString& name,
                                                      const QStringList& selectors) {
        return {name, selectors};
    }
    bool responds(const QString& selector) const { return selectors.contains(selector); }
};

} // namespace platform
