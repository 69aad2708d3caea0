#pragma once

#include <QString>

namespace platform::HostMessages {

// The "type" of each message on the host connection.
inline const QString Request =
    QStringLiteral("request"); // host -> extension: {"inputItems": [...]}
inline const QString Dismiss =
    QStringLiteral("dismiss"); // host -> extension: the host closes the editor
inline const QString Invoke =
    QStringLiteral("invoke"); // extension -> host: {"selector", "arguments"}

// The environment variable that tells the extension process which descriptor
// is its end of the host connection.
inline constexpr const char* HostDescriptorVariable = "TAMSEL_HOST_FD";

} // namespace platform::HostMessages
