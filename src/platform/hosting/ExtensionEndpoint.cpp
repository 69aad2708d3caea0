#include "ExtensionEndpoint.h"

#include "HostMessages.h"

#include <QCborArray>

namespace platform {

std::unique_ptr<ExtensionEndpoint> ExtensionEndpoint::fromEnvironment() {
    bool ok = false;
    const int fd = qEnvironmentVariableIntValue(HostMessages::HostDescriptorVariable, &ok);
    // The descriptor must not leak into processes this one starts.
    qunsetenv(HostMessages::HostDescriptorVariable);
    if (!ok || fd < 0)
        return std::make_unique<ExtensionEndpoint>(nullptr);
    // QObject children die with their parent; the channel must die with its
    // last owner, on the main thread, so it gets a deleter that defers.
    auto channel = std::shared_ptr<MessageChannel>(new MessageChannel(fd),
                                                   [](MessageChannel* c) { c->deleteLater(); });
    return std::make_unique<ExtensionEndpoint>(channel);
}

ExtensionEndpoint::ExtensionEndpoint(std::shared_ptr<MessageChannel> channel)
    : channel_(std::move(channel)) {
    if (!channel_)
        return;
    channel_->onMessage = [this](const QCborMap& message) {
        const QString type = message.value(QStringLiteral("type")).toString();
        if (type == HostMessages::Request && onRequest)
            onRequest(decodeExtensionItems(message.value(QStringLiteral("inputItems"))));
        else if (type == HostMessages::Dismiss && onDismiss)
            onDismiss();
    };
    channel_->onClosed = [this] {
        if (onHostGone)
            onHostGone();
    };
}

} // namespace platform
