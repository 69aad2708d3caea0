#include "Error.h"

#include <cstdint>
#include <cstring>

namespace platform {

Error::Error(int code, QString domain, QString message)
    : code_(code), domain_(std::move(domain)), message_(std::move(message)) {}

int Error::identity() const {
    // The handle of the error value, narrowed the way a "%i" of a pointer is.
    return static_cast<int>(reinterpret_cast<std::uintptr_t>(this));
}

QString Error::description() const {
    return QStringLiteral("Error Domain=%1 Code=%2 \"%3\"").arg(domain_).arg(code_).arg(message_);
}

ErrorPtr makeError(int code, const QString& domain, const QString& message) {
    return std::make_shared<const Error>(code, domain, message);
}

ErrorPtr posixError(int errnoValue, const QString& devicePath) {
    return makeError(errnoValue, QStringLiteral("POSIX"),
                     QStringLiteral("%1: %2").arg(
                         devicePath, QString::fromLocal8Bit(std::strerror(errnoValue))));
}

ErrorPtr posixError(const std::error_code& ec, const QString& devicePath) {
    return posixError(ec.value(), devicePath);
}

} // namespace platform
