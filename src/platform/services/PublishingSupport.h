#pragma once

#include "platform/runtime/Implementation.h"

#include <memory>

namespace platform {

// Whether the platform can publish videos to YouTube: the publishing plug-in
// is installed at PublishingPlugin::youTubePluginPath. The share sheet offers
// its YouTube activity only then. Any thread.
class PublishingSupport {
  public:
    virtual ~PublishingSupport() = default;
    virtual bool isYouTubeSupportPresent() = 0;

    static std::shared_ptr<PublishingSupport> sharedSupport();
    using Maker = std::shared_ptr<PublishingSupport>();
    static Implementation<Maker>& implementation();
};

} // namespace platform
