#pragma once

#include "platform/media/playback/PlayerLayer.h"

#include <memory>

namespace platform {

class VideoSurface;

// The layer that draws an MpvPlayer's video: with OpenGL when the display has
// it and with libmpv's software renderer otherwise (see
// VideoSurface::preferredKind). Another kind of player shows as black.
class MpvPlayerLayer final : public PlayerLayer {
  public:
    explicit MpvPlayerLayer(QWidget* parent = nullptr);
    ~MpvPlayerLayer() override;

    const std::shared_ptr<Player>& player() const override { return player_; }
    void setPlayer(std::shared_ptr<Player> player) override;
    bool isReadyForDisplay() const override;
    // Whether the video is drawn with OpenGL (false: software).
    bool usesOpenGL() const;

  protected:
    void resizeEvent(QResizeEvent* event) override;

  private:
    void makeSurface(int kind);

    std::shared_ptr<Player> player_;
    std::unique_ptr<VideoSurface> surface_;
};

} // namespace platform
