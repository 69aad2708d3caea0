#include "PublishingSupport.h"

#include "platform/runtime/DevicePaths.h"
#include "platform/services/PublishingPlugin.h"

#include <QFileInfo>

namespace platform {

namespace {

class InstalledPluginSupport final : public PublishingSupport {
  public:
    bool isYouTubeSupportPresent() override {
        return QFileInfo(DevicePaths::toHost(PublishingPlugin::youTubePluginPath)).isFile();
    }
};

} // namespace

Implementation<PublishingSupport::Maker>& PublishingSupport::implementation() {
    static Implementation<Maker> chosen([]() -> std::shared_ptr<PublishingSupport> {
        static const auto installed = std::make_shared<InstalledPluginSupport>();
        return installed;
    });
    return chosen;
}

std::shared_ptr<PublishingSupport> PublishingSupport::sharedSupport() {
    return implementation().make();
}

} // namespace platform
