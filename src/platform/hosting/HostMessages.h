#pragma once

#include <QCborMap>
#include <QString>
#include <QStringList>
#include <optional>

namespace platform::HostMessages {

// The "type" of each message on the host connection.
inline const QString Request =
    QStringLiteral("request"); // host -> extension: {"inputItems": [...]}
inline const QString Dismiss =
    QStringLiteral("dismiss"); // host -> extension: the host closes the editor
inline const QString Invoke =
    QStringLiteral("invoke"); // extension -> host: {"selector", "arguments"}
inline const QString Working =
    QStringLiteral("working"); // extension -> host: ended, still finishing queued work

// The activity types of an extensionDidFinishWithActivityTypes: report;
// nullopt for any other message. Whatever the peer sent, never fails.
std::optional<QStringList> activityTypesOfReport(const QCborMap& message);

// The environment variable that tells the extension process which descriptor
// is its end of the host connection.
inline constexpr const char* HostDescriptorVariable = "TAMSEL_HOST_FD";

} // namespace platform::HostMessages
