#pragma once

#include "platform/media/playback/PlayerItem.h"

namespace platform {

class MpvPlayer;

// The item that MpvPlayer plays: ReadyToPlay once libmpv has opened the file
// and found a video or audio track. What libmpv learns while playing (the
// duration, the spans it can read) is handed in by the player that plays it.
class MpvPlayerItem final : public PlayerItem {
  public:
    explicit MpvPlayerItem(std::shared_ptr<Asset> asset);

    MediaTime duration() const override;
    MediaTime currentTime() const override;
    QList<MediaTimeRange> loadedTimeRanges() const override;

  private:
    friend class MpvPlayer;

    // Called by the player that plays the item.
    using PlayerItem::setStatus;
    void setLoadedTimeRanges(QList<MediaTimeRange> ranges) { loadedRanges_ = std::move(ranges); }
    void setDurationSeconds(double seconds) { playerDuration_ = seconds; }

    QList<MediaTimeRange> loadedRanges_;
    double playerDuration_ = 0;
    std::weak_ptr<MpvPlayer> player_;
};

} // namespace platform
