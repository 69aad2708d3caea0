#pragma once

#include "ExtensionItem.h"
#include "MessageChannel.h"

#include <QObject>
#include <functional>
#include <memory>

namespace platform {

// The extension process's side of the host connection: it receives the
// request and the host's dismissal, and notices when the host has gone.
// Lives on the main thread; its callbacks run there, and never after the
// endpoint is destroyed, however long others keep the channel.
class ExtensionEndpoint {
  public:
    // The endpoint on the descriptor named by TAMSEL_HOST_FD; one without a
    // host (channel() null) when there is none.
    static std::unique_ptr<ExtensionEndpoint> fromEnvironment();
    explicit ExtensionEndpoint(std::shared_ptr<MessageChannel> channel);
    ~ExtensionEndpoint();
    ExtensionEndpoint(const ExtensionEndpoint&) = delete;
    ExtensionEndpoint& operator=(const ExtensionEndpoint&) = delete;

    // The way out, once the request has ended: runs the work still queued
    // (worker queues, the main queue, what that queues in turn) to its end,
    // telling the host every `heartbeatMs` that it is still at it, so that a
    // host that waits for the extension to end does not kill it meanwhile.
    // Main thread; call it while the application object is there.
    void finishQueuedWork(int heartbeatMs = 1000);

    const std::shared_ptr<MessageChannel>& channel() const { return channel_; }
    bool hasHost() const { return channel_ != nullptr; }

    std::function<void(QList<ExtensionItem> inputItems)> onRequest;
    std::function<void()> onDismiss;
    std::function<void()> onHostGone;

  private:
    std::shared_ptr<MessageChannel> channel_;
};

} // namespace platform
