#include "HostMessages.h"

#include <QCborArray>

namespace platform::HostMessages {

std::optional<QStringList> activityTypesOfReport(const QCborMap& message) {
    if (message.value(QStringLiteral("type")).toString() != Invoke)
        return std::nullopt;
    if (message.value(QStringLiteral("selector")).toString() !=
        QLatin1String("extensionDidFinishWithActivityTypes:"))
        return std::nullopt;
    // Entries that are not strings are not activity types; the rest stand.
    QStringList types;
    for (const QCborValue& type :
         message.value(QStringLiteral("arguments")).toArray().at(0).toArray())
        if (type.isString())
            types.append(type.toString());
    return types;
}

} // namespace platform::HostMessages
