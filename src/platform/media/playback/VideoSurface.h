#pragma once

#include <functional>
#include <memory>

class QWidget;

namespace platform {

class MpvPlayer;

// What draws a player's video inside a PlayerLayer: libmpv's OpenGL renderer
// in a GL widget, or its software renderer into an image painted with
// QPainter. Main thread only. The surface's widget is a child of the layer
// and is deleted with the surface.
class VideoSurface {
  public:
    enum class Kind { OpenGL, Software };

    virtual ~VideoSurface() = default;

    // The one place the drawing path is chosen: OpenGL when a GL context on
    // graphics hardware can be made current on this display, software
    // otherwise (a CPU rasteriser behind GL, the offscreen and minimal
    // platforms). TAMSEL_VIDEO_RENDERER=software or
    // =opengl overrides the choice. Needs a QGuiApplication; decided once per
    // process, except for the override, which is read on every call.
    static Kind preferredKind();
    static std::unique_ptr<VideoSurface> create(Kind kind, QWidget* parent);

    virtual Kind kind() const = 0;
    virtual QWidget* widget() = 0;
    // Takes over the player's video (null: lets it go). The surface holds the
    // player only weakly; the layer holds it strongly.
    virtual void setPlayer(const std::shared_ptr<MpvPlayer>& player) = 0;
    // True once a frame of the current player has been drawn.
    virtual bool hasFrame() const = 0;

    // Called on the main thread when the surface cannot draw at all (libmpv
    // refused its renderer), so the layer can put another kind in its place.
    std::function<void()> onFailed;
};

} // namespace platform
