#pragma once

#include "platform/runtime/Error.h"

#include <QCborArray>
#include <QString>
#include <functional>
#include <memory>

namespace platform {

class AuxiliaryConnection;

// Sends one-way messages to the object on the other side of an auxiliary
// connection. Sending returns at once; the message goes out on the
// connection's own thread, in the order sent. When it cannot be delivered the
// error handler is called on that thread; nothing else happens.
class RemoteObjectProxy {
  public:
    using ErrorHandler = std::function<void(ErrorPtr error)>;

    // Error codes of undeliverable messages besides the POSIX ones.
    enum ErrorCode {
        ConnectionInvalid = 4097,
        ConnectionInterrupted = 4099,
        UnknownSelector = 4100
    };

    RemoteObjectProxy(std::shared_ptr<AuxiliaryConnection> connection, ErrorHandler errorHandler);

    // Sends `selector` with `arguments`. Callable from any thread.
    void invoke(const QString& selector, const QCborArray& arguments);

    // The message of the host protocol.
    void extensionDidFinishWithActivityTypes(const QStringList& activityTypes);

  private:
    std::shared_ptr<AuxiliaryConnection> connection_;
    ErrorHandler errorHandler_;
};

} // namespace platform
