#include "TXYouTubeActivity.h"

#include "platform/ui/Device.h"

using namespace platform;

std::shared_ptr<TXYouTubeActivity> TXYouTubeActivity::init() {
    return std::shared_ptr<TXYouTubeActivity>(new TXYouTubeActivity);
}

QString TXYouTubeActivity::activityType() const {
    return QStringLiteral("TXPublishToYouTube");
}

QString TXYouTubeActivity::activityTitle() const {
    return QStringLiteral("YouTube");
}

ActivityCategory TXYouTubeActivity::activityCategory() const {
    return ActivityCategory::Share;
}

bool TXYouTubeActivity::canPerformWithActivityItems(const QVariantList& items) {
    return Device::deviceSupportsCapability(Device::VideoPublishingCapability);
}
