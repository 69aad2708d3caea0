#include "AuxiliaryConnection.h"

#include "MessageChannel.h"

#include <QCborArray>
#include <cerrno>

namespace platform {

AuxiliaryConnection::AuxiliaryConnection(std::shared_ptr<MessageChannel> channel,
                                         InterfaceDescription exportedInterface,
                                         InterfaceDescription remoteObjectInterface)
    : channel_(std::move(channel)), exported_(std::move(exportedInterface)),
      remote_(std::move(remoteObjectInterface)) {
    serial_.setMaxThreadCount(1);
    serial_.setExpiryTimeout(-1);
}

AuxiliaryConnection::~AuxiliaryConnection() {
    serial_.waitForDone();
}

std::shared_ptr<RemoteObjectProxy>
AuxiliaryConnection::remoteObjectProxyWithErrorHandler(RemoteObjectProxy::ErrorHandler handler) {
    return std::make_shared<RemoteObjectProxy>(shared_from_this(), std::move(handler));
}

void AuxiliaryConnection::send(QCborMap message, std::function<void(ErrorPtr)> done) {
    // The job holds the channel, not the connection: the connection may go
    // away (and wait here) while its last messages leave.
    serial_.start([channel = channel_, message = std::move(message), done = std::move(done)] {
        ErrorPtr error;
        if (!channel)
            error = makeError(RemoteObjectProxy::ConnectionInvalid, QStringLiteral("Connection"),
                              QStringLiteral("the connection to the host is invalid"));
        else if (ErrorPtr sendError = channel->send(message))
            error = sendError->code() == EPIPE
                        ? makeError(RemoteObjectProxy::ConnectionInterrupted,
                                    QStringLiteral("Connection"),
                                    QStringLiteral("the connection to the host was interrupted"))
                        : sendError;
        if (done)
            done(error);
    });
}

void AuxiliaryConnection::flush() {
    serial_.waitForDone();
}

RemoteObjectProxy::RemoteObjectProxy(std::shared_ptr<AuxiliaryConnection> connection,
                                     ErrorHandler errorHandler)
    : connection_(std::move(connection)), errorHandler_(std::move(errorHandler)) {}

void RemoteObjectProxy::invoke(const QString& selector, const QCborArray& arguments) {
    if (!connection_->remoteObjectInterface().responds(selector)) {
        if (errorHandler_)
            errorHandler_(
                makeError(UnknownSelector, QStringLiteral("Connection"),
                          QStringLiteral("the host does not respond to %1").arg(selector)));
        return;
    }
    const QCborMap message{{QStringLiteral("type"), QStringLiteral("invoke")},
                           {QStringLiteral("selector"), selector},
                           {QStringLiteral("arguments"), arguments}};
    connection_->send(message, [handler = errorHandler_](ErrorPtr error) {
        if (error && handler)
            handler(error);
    });
}

void RemoteObjectProxy::extensionDidFinishWithActivityTypes(const QStringList& activityTypes) {
    QCborArray types;
    for (const QString& type : activityTypes)
        types.append(type);
    invoke(QStringLiteral("extensionDidFinishWithActivityTypes:"), QCborArray{types});
}

} // namespace platform
