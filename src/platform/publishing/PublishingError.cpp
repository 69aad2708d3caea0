#include "platform/publishing/PublishingError.h"

namespace platform::PublishingError {

QString domain() {
    return QStringLiteral("TamselPublishing");
}

ErrorPtr make(Code code, const QString& message) {
    return makeError(code, domain(), message);
}

bool is(const ErrorPtr& error, Code code) {
    return error && error->domain() == domain() && error->code() == code;
}

} // namespace platform::PublishingError
