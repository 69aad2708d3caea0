#include "platform/ui/ImageView.h"

#include <QPainter>

namespace platform {

ImageView::ImageView(const QImage& image, QWidget* parent)
    : View(QRectF(QPointF(0, 0), image.deviceIndependentSize()), parent), image_(image) {}

void ImageView::setImage(const QImage& image) {
    image_ = image;
    update();
}

QSizeF ImageView::sizeThatFits(const QSizeF&) const {
    return image_.deviceIndependentSize();
}

void ImageView::paintEvent(QPaintEvent* event) {
    View::paintEvent(event);
    if (image_.isNull())
        return;
    QPainter painter(this);
    painter.setRenderHint(QPainter::SmoothPixmapTransform);
    painter.drawImage(bounds(), image_);
}

} // namespace platform
