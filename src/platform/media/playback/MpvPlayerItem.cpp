#include "MpvPlayerItem.h"

#include "MpvPlayer.h"

#include <cmath>

namespace platform {

Implementation<PlayerItem::Maker>& PlayerItem::implementation() {
    static Implementation<Maker> chosen([](std::shared_ptr<Asset> asset) {
        return std::shared_ptr<PlayerItem>(std::make_shared<MpvPlayerItem>(std::move(asset)));
    });
    return chosen;
}

MpvPlayerItem::MpvPlayerItem(std::shared_ptr<Asset> asset) : PlayerItem(std::move(asset)) {}

MediaTime MpvPlayerItem::duration() const {
    if (status() != Status::ReadyToPlay)
        return MediaTime::invalid();
    const MediaTime fromHeaders = asset()->duration();
    if (fromHeaders.isNumeric() && fromHeaders > MediaTime::zero())
        return fromHeaders;
    if (std::isfinite(playerDuration_) && playerDuration_ > 0)
        return MediaTime::fromSeconds(playerDuration_, timescale());
    return MediaTime::invalid();
}

MediaTime MpvPlayerItem::currentTime() const {
    const std::shared_ptr<MpvPlayer> player = player_.lock();
    if (!player || player->currentItem().get() != this)
        return MediaTime::invalid();
    return player->currentTime();
}

QList<MediaTimeRange> MpvPlayerItem::loadedTimeRanges() const {
    if (status() != Status::ReadyToPlay)
        return {};
    if (!loadedRanges_.isEmpty())
        return loadedRanges_;
    // libmpv keeps no cache for a local file: all of it can be read at once.
    if (!asset()->hostPath().isEmpty() && duration().isValid())
        return {MediaTimeRange::make(MediaTime::make(0, timescale()), duration())};
    return {};
}

} // namespace platform
