#pragma once

#include "platform/media/playback/Player.h"

#include <QWidget>

#include <memory>

namespace platform {

class VideoSurface;

// A widget that shows a player's video, scaled to fit with its aspect kept
// (black bars elsewhere). Drawn with OpenGL when the display has it and with
// libmpv's software renderer otherwise (see VideoSurface::preferredKind).
//
// Threads: main thread only. Ownership: a QWidget owned by its Qt parent; it
// holds its player strongly. A player is shown by one layer at a time: the
// layer pointed at it last takes the video, an earlier one keeps its last
// picture. Without a layer the player still plays (see Player).
class PlayerLayer : public QWidget {
  public:
    explicit PlayerLayer(QWidget* parent = nullptr);
    ~PlayerLayer() override;

    static PlayerLayer* playerLayerWithPlayer(std::shared_ptr<Player> player,
                                              QWidget* parent = nullptr);

    const std::shared_ptr<Player>& player() const { return player_; }
    void setPlayer(std::shared_ptr<Player> player);

    // The layer's rectangle in its parent's coordinates.
    QRect frame() const { return geometry(); }
    void setFrame(const QRect& frame) { setGeometry(frame); }

    // True once a frame of the current player's video has been drawn.
    bool isReadyForDisplay() const;
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
