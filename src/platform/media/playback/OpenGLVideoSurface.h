#pragma once

#include "VideoSurface.h"

#include <QOpenGLWidget>

#include <cstdint>
#include <memory>

namespace platform {

class MpvCore;

// Draws the video with libmpv's OpenGL renderer into the widget's
// framebuffer. The renderer is made once the widget's GL context exists
// (its first initializeGL), and is always released with that context
// current.
class OpenGLVideoSurface final : public QOpenGLWidget, public VideoSurface {
  public:
    explicit OpenGLVideoSurface(QWidget* parent);
    ~OpenGLVideoSurface() override;

    Kind kind() const override { return Kind::OpenGL; }
    QWidget* widget() override { return this; }
    void setPlayer(const std::shared_ptr<MpvPlayer>& player) override;
    bool hasFrame() const override { return hasFrame_; }

  protected:
    void initializeGL() override;
    void paintGL() override;

  private:
    void attach();
    void detach();
    void onUpdate();

    std::weak_ptr<MpvPlayer> player_;
    std::weak_ptr<MpvCore> core_;
    std::uint64_t attachment_ = 0;
    bool glReady_ = false;
    bool frameSeen_ = false;
    bool hasFrame_ = false;
};

} // namespace platform
