#include "SoftwareVideoSurface.h"

#include "MpvCore.h"
#include "MpvPlayer.h"

#include <QPainter>

namespace platform {

SoftwareVideoSurface::SoftwareVideoSurface(QWidget* parent) : QWidget(parent) {
    setAttribute(Qt::WA_OpaquePaintEvent);
}

SoftwareVideoSurface::~SoftwareVideoSurface() {
    detach();
}

void SoftwareVideoSurface::detach() {
    if (auto core = core_.lock())
        core->detachRenderer(attachment_);
    core_.reset();
    attachment_ = 0;
}

void SoftwareVideoSurface::setPlayer(const std::shared_ptr<MpvPlayer>& player) {
    detach();
    hasFrame_ = false;
    frameSeen_ = false;
    image_ = QImage();
    QWidget::update();
    if (!player || !player->mpvCore())
        return;
    const std::shared_ptr<MpvCore>& core = player->mpvCore();
    mpv_render_param params[] = {
        {MPV_RENDER_PARAM_API_TYPE, const_cast<char*>(MPV_RENDER_API_TYPE_SW)},
        {MPV_RENDER_PARAM_INVALID, nullptr},
    };
    attachment_ = core->attachRenderer(params, {[this] { renderFrame(false); }, {}, {}});
    if (attachment_ == 0) {
        if (onFailed)
            onFailed();
        return;
    }
    core_ = core;
    // A paused player sends no frame until it moves: draw the one it has.
    renderFrame(true);
}

void SoftwareVideoSurface::renderFrame(bool force) {
    const std::shared_ptr<MpvCore> core = core_.lock();
    mpv_render_context* context = core ? core->renderContext(attachment_) : nullptr;
    if (!context)
        return;
    const bool newFrame = mpv_render_context_update(context) & MPV_RENDER_UPDATE_FRAME;
    frameSeen_ = frameSeen_ || newFrame;
    if (!newFrame && !force)
        return;

    const qreal ratio = devicePixelRatioF();
    const QSize size = (QSizeF(this->size()) * ratio).toSize().expandedTo(QSize(1, 1));
    if (!isVisible()) {
        if (!newFrame)
            return;
        int skip = 1;
        int noWait = 0;
        mpv_render_param params[] = {{MPV_RENDER_PARAM_SKIP_RENDERING, &skip},
                                     {MPV_RENDER_PARAM_BLOCK_FOR_TARGET_TIME, &noWait},
                                     {MPV_RENDER_PARAM_INVALID, nullptr}};
        mpv_render_context_render(context, params);
        return;
    }
    if (image_.size() != size) {
        // RGBX8888 is libmpv's "rgb0": bytes R, G, B, pad.
        image_ = QImage(size, QImage::Format_RGBX8888);
        image_.setDevicePixelRatio(ratio);
    }
    int dimensions[2] = {size.width(), size.height()};
    size_t stride = size_t(image_.bytesPerLine());
    int noWait = 0;
    mpv_render_param params[] = {
        {MPV_RENDER_PARAM_SW_SIZE, dimensions},
        {MPV_RENDER_PARAM_SW_FORMAT, const_cast<char*>("rgb0")},
        {MPV_RENDER_PARAM_SW_STRIDE, &stride},
        {MPV_RENDER_PARAM_SW_POINTER, image_.bits()},
        {MPV_RENDER_PARAM_BLOCK_FOR_TARGET_TIME, &noWait},
        {MPV_RENDER_PARAM_INVALID, nullptr},
    };
    if (mpv_render_context_render(context, params) >= 0) {
        hasFrame_ = frameSeen_;
        QWidget::update();
    }
}

void SoftwareVideoSurface::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    if (image_.isNull()) {
        painter.fillRect(rect(), Qt::black);
        return;
    }
    // libmpv letterboxes inside the image, so it covers the widget exactly.
    painter.drawImage(rect(), image_);
}

void SoftwareVideoSurface::resizeEvent(QResizeEvent* event) {
    QWidget::resizeEvent(event);
    // A paused player sends no new frame; draw the current one at the new
    // size now.
    renderFrame(true);
}

void SoftwareVideoSurface::showEvent(QShowEvent* event) {
    QWidget::showEvent(event);
    renderFrame(true);
}

} // namespace platform
