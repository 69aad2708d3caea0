#include "ExtensionEndpoint.h"

#include "HostMessages.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/runtime/MainQueue.h"

#include <QCborArray>
#include <QTimer>

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

ExtensionEndpoint::~ExtensionEndpoint() {
    // The channel may outlive this endpoint (the connection to the host holds
    // it while its last messages leave), and the final drain still turns the
    // event loop: a message or a hang-up arriving then must find no callback
    // that leads back here.
    if (channel_) {
        channel_->onMessage = nullptr;
        channel_->onClosed = nullptr;
    }
}

void ExtensionEndpoint::finishQueuedWork(int heartbeatMs) {
    QTimer heartbeat;
    if (channel_) {
        const std::weak_ptr<MessageChannel> channel = channel_;
        QObject::connect(&heartbeat, &QTimer::timeout, [channel] {
            if (const auto open = channel.lock(); open && open->isOpen())
                open->send(QCborMap{{QStringLiteral("type"), HostMessages::Working}});
        });
        heartbeat.start(heartbeatMs);
    }
    // Work on the main queue may queue more for the workers (an editor's last
    // owner letting go removes its clip), and the workers may wait on the
    // main queue: hence both, twice.
    GlobalQueue::drain();
    MainQueue::runPending();
    GlobalQueue::drain();
}

} // namespace platform
