#pragma once

#include <QString>
#include <memory>
#include <system_error>

namespace platform {

// A failure reported by a platform service. Errors are immutable and shared:
// whoever receives one may keep it as long as it likes. "No error" is a null
// ErrorPtr.
class Error {
  public:
    Error(int code, QString domain, QString message);

    // The signed integer code that logs and callers compare (errno values for
    // the file system, negative AVERROR values for media, and so on).
    int code() const { return code_; }
    const QString& domain() const { return domain_; }
    const QString& message() const { return message_; }

    // The error value's identity, as a 32-bit integer: the same for every
    // report of this one error, different between errors that are alive at
    // the same time. Some log lines print this instead of the code.
    int identity() const;

    // "Error Domain=<domain> Code=<code> "<message>"", the text that console
    // lines print for an error.
    QString description() const;

  private:
    int code_;
    QString domain_;
    QString message_;
};

using ErrorPtr = std::shared_ptr<const Error>;

// Builders for the common domains. The message names the device path, never
// a host path, so the text can go to the log as it is.
ErrorPtr makeError(int code, const QString& domain, const QString& message);
ErrorPtr posixError(int errnoValue, const QString& devicePath);
ErrorPtr posixError(const std::error_code& ec, const QString& devicePath);

// Writes `error` through `out` when `out` is not null; the out-parameter
// convention of the file-system services.
inline void setError(ErrorPtr* out, ErrorPtr error) {
    if (out)
        *out = std::move(error);
}

} // namespace platform
