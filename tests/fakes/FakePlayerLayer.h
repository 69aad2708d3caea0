#pragma once

#include "platform/media/playback/PlayerLayer.h"

namespace fakes {

// A player layer that draws nothing (its black background only); it is ready
// for display once its player's item is ready to play.
class FakePlayerLayer final : public platform::PlayerLayer {
  public:
    explicit FakePlayerLayer(QWidget* parent = nullptr);

    const std::shared_ptr<platform::Player>& player() const override { return player_; }
    void setPlayer(std::shared_ptr<platform::Player> player) override {
        player_ = std::move(player);
    }
    bool isReadyForDisplay() const override;

  private:
    std::shared_ptr<platform::Player> player_;
};

} // namespace fakes
