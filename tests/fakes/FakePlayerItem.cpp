#include "FakePlayerItem.h"

#include "FakePlayer.h"

using namespace platform;

namespace fakes {

FakePlayerItem::FakePlayerItem(std::shared_ptr<Asset> asset) : PlayerItem(std::move(asset)) {}

MediaTime FakePlayerItem::duration() const {
    if (status() != Status::ReadyToPlay)
        return MediaTime::invalid();
    return asset()->duration();
}

MediaTime FakePlayerItem::currentTime() const {
    const std::shared_ptr<FakePlayer> player = player_.lock();
    if (!player || player->currentItem().get() != this)
        return MediaTime::invalid();
    return player->currentTime();
}

QList<MediaTimeRange> FakePlayerItem::loadedTimeRanges() const {
    if (status() != Status::ReadyToPlay || !duration().isValid())
        return {};
    return {MediaTimeRange::make(MediaTime::make(0, timescale()), duration())};
}

} // namespace fakes
