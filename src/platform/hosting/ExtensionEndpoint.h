#pragma once

#include "ExtensionItem.h"
#include "MessageChannel.h"

#include <QObject>
#include <functional>
#include <memory>

namespace platform {

// The extension process's side of the host connection: it receives the
// request and the host's dismissal, and notices when the host has gone.
// Lives on the main thread; its callbacks run there.
class ExtensionEndpoint {
  public:
    // The endpoint on the descriptor named by TAMSEL_HOST_FD; one without a
    // host (channel() null) when there is none.
    static std::unique_ptr<ExtensionEndpoint> fromEnvironment();
    explicit ExtensionEndpoint(std::shared_ptr<MessageChannel> channel);

    const std::shared_ptr<MessageChannel>& channel() const { return channel_; }
    bool hasHost() const { return channel_ != nullptr; }

    std::function<void(QList<ExtensionItem> inputItems)> onRequest;
    std::function<void()> onDismiss;
    std::function<void()> onHostGone;

  private:
    std::shared_ptr<MessageChannel> channel_;
};

} // namespace platform
