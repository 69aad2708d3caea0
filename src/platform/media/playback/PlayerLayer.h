#pragma once

#include "platform/media/playback/Player.h"
#include "platform/runtime/Implementation.h"

#include <QWidget>

#include <memory>

namespace platform {

// A widget that shows a player's video, scaled to fit with its aspect kept
// (black bars elsewhere).
//
// Threads: main thread only. Ownership: a QWidget owned by its Qt parent; it
// holds its player strongly. A player is shown by one layer at a time: the
// layer pointed at it last takes the video, an earlier one keeps its last
// picture. Without a layer the player still plays (see Player).
class PlayerLayer : public QWidget {
  public:
    // A layer from implementation(): the real one, drawing what libmpv
    // decodes, unless a test replaced it.
    static PlayerLayer* playerLayerWithPlayer(std::shared_ptr<Player> player,
                                              QWidget* parent = nullptr);
    using Maker = PlayerLayer*(QWidget* parent);
    static Implementation<Maker>& implementation();

    virtual const std::shared_ptr<Player>& player() const = 0;
    virtual void setPlayer(std::shared_ptr<Player> player) = 0;

    // The layer's rectangle in its parent's coordinates.
    QRect frame() const { return geometry(); }
    void setFrame(const QRect& frame) { setGeometry(frame); }

    // True once a frame of the current player's video has been drawn.
    virtual bool isReadyForDisplay() const = 0;

  protected:
    explicit PlayerLayer(QWidget* parent) : QWidget(parent) {}
};

} // namespace platform
