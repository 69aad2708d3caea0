#pragma once

#include "platform/media/playback/PlayerItem.h"

namespace fakes {

class FakePlayer;

// A player item that a FakePlayer "loads": it becomes ReadyToPlay when the
// asset has tracks and Failed otherwise, through the same status observers
// as the real item (on the main queue, after the change). Ready, the whole
// movie counts as loaded.
class FakePlayerItem final : public platform::PlayerItem {
  public:
    explicit FakePlayerItem(std::shared_ptr<platform::Asset> asset);

    platform::MediaTime duration() const override;
    platform::MediaTime currentTime() const override;
    QList<platform::MediaTimeRange> loadedTimeRanges() const override;

    // What loading concludes; main thread.
    void becomeReady() { setStatus(Status::ReadyToPlay); }
    void fail(platform::ErrorPtr error) { setStatus(Status::Failed, std::move(error)); }

  private:
    friend class FakePlayer;
    std::weak_ptr<FakePlayer> player_;
};

} // namespace fakes
