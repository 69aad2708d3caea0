#pragma once

#include "VideoSurface.h"

#include <QImage>
#include <QWidget>

#include <cstdint>
#include <memory>

namespace platform {

class MpvCore;

// Draws the video with libmpv's software renderer into an image the size of
// the widget (in device pixels), painted with QPainter. Frames are rendered
// when libmpv has one, not at paint time, so a hidden or unpainted widget
// still keeps the video clock moving (it then skips the drawing).
class SoftwareVideoSurface final : public QWidget, public VideoSurface {
  public:
    explicit SoftwareVideoSurface(QWidget* parent);
    ~SoftwareVideoSurface() override;

    Kind kind() const override { return Kind::Software; }
    QWidget* widget() override { return this; }
    void setPlayer(const std::shared_ptr<MpvPlayer>& player) override;
    bool hasFrame() const override { return hasFrame_; }

  protected:
    void paintEvent(QPaintEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void showEvent(QShowEvent* event) override;

  private:
    void detach();
    // Draws the frame libmpv has; `force` draws it even when it is not new.
    void renderFrame(bool force);

    std::weak_ptr<MpvCore> core_;
    std::uint64_t attachment_ = 0;
    QImage image_;
    bool hasFrame_ = false;
    bool frameSeen_ = false;
};

} // namespace platform
