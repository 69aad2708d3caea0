#include "platform/ui/ImageContext.h"

#include "platform/ui/Screen.h"

#include <cmath>

namespace platform {

ImageContext::ImageContext(const QSizeF& size, bool opaque, qreal scale)
    : size_(size.isValid() ? size : QSizeF(0, 0)),
      scale_(scale > 0 ? scale : Screen::mainScreen().scale()) {
    const QSize pixels(int(std::ceil(size_.width() * scale_ - 0.001)),
                       int(std::ceil(size_.height() * scale_ - 0.001)));
    if (pixels.isEmpty())
        return;
    bitmap_ = QImage(pixels, QImage::Format_ARGB32_Premultiplied);
    bitmap_.fill(opaque ? Qt::black : Qt::transparent);
    bitmap_.setDevicePixelRatio(scale_);
    painter_ = std::make_unique<QPainter>(&bitmap_);
    painter_->setRenderHint(QPainter::SmoothPixmapTransform);
}

ImageContext::~ImageContext() = default;

QPainter::CompositionMode ImageContext::compositionMode(BlendMode mode) {
    switch (mode) {
    case BlendMode::DestinationOut:
        return QPainter::CompositionMode_DestinationOut;
    case BlendMode::Normal:
        break;
    }
    return QPainter::CompositionMode_SourceOver;
}

void ImageContext::fillRect(const QRectF& rect, qreal white, qreal alpha) {
    if (!painter_)
        return;
    painter_->setCompositionMode(QPainter::CompositionMode_SourceOver);
    painter_->setOpacity(1.0);
    painter_->fillRect(rect,
                       QColor::fromRgbF(float(white), float(white), float(white), float(alpha)));
}

void ImageContext::drawImage(const QImage& image, const QPointF& point, BlendMode mode,
                             qreal alpha) {
    if (!painter_ || image.isNull())
        return;
    painter_->setCompositionMode(compositionMode(mode));
    painter_->setOpacity(alpha);
    // The image's own device pixel ratio gives its size in points.
    painter_->drawImage(QRectF(point, image.deviceIndependentSize()), image);
    painter_->setOpacity(1.0);
    painter_->setCompositionMode(QPainter::CompositionMode_SourceOver);
}

QImage ImageContext::image() {
    if (!painter_)
        return {};
    painter_->end();
    QImage copy = bitmap_.copy();
    copy.setDevicePixelRatio(scale_);
    painter_->begin(&bitmap_);
    painter_->setRenderHint(QPainter::SmoothPixmapTransform);
    return copy;
}

} // namespace platform
