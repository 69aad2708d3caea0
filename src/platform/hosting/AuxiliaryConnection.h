#pragma once

#include "InterfaceDescription.h"
#include "RemoteObjectProxy.h"
#include "platform/runtime/Error.h"

#include <QCborMap>
#include <QThreadPool>
#include <memory>

namespace platform {

class MessageChannel;

// The private two-way channel between an extension and its host, described by
// the interface each side exports. Messages leave on the connection's own
// serial thread, so a slow host never blocks the main thread.
class AuxiliaryConnection : public std::enable_shared_from_this<AuxiliaryConnection> {
  public:
    // `channel` may be null: a connection without a host, whose every message
    // fails with ConnectionInvalid.
    AuxiliaryConnection(std::shared_ptr<MessageChannel> channel,
                        InterfaceDescription exportedInterface,
                        InterfaceDescription remoteObjectInterface);
    ~AuxiliaryConnection();

    const InterfaceDescription& exportedInterface() const { return exported_; }
    const InterfaceDescription& remoteObjectInterface() const { return remote_; }

    // A new proxy on this connection for each call.
    std::shared_ptr<RemoteObjectProxy>
    remoteObjectProxyWithErrorHandler(RemoteObjectProxy::ErrorHandler handler);

    // Queues `message` on the connection's thread; `done` gets the outcome
    // there (null when the bytes went out).
    void send(QCborMap message, std::function<void(ErrorPtr)> done);

    // Waits until every queued message has been sent (or has failed).
    void flush();

  private:
    std::shared_ptr<MessageChannel> channel_;
    InterfaceDescription exported_;
    InterfaceDescription remote_;
    QThreadPool serial_;
};

} // namespace platform
