#include "platform/ui/ApplicationIconImage.h"

#include <QPainter>
#include <QPainterPath>

#include <cmath>

namespace platform::ApplicationIconImage {

qreal sideOf(Format format) {
    switch (format) {
    case Format::Small:
        return 29;
    case Format::Medium:
        return 40;
    case Format::Large:
        return 60;
    }
    return 29;
}

QImage applicationIconImageForFormat_precomposed_scale(const QImage& image, Format format, bool,
                                                       qreal scale) {
    if (!(scale > 0))
        scale = 1;
    const qreal side = sideOf(format);
    const int pixels = int(std::lround(side * scale));
    QImage icon(pixels, pixels, QImage::Format_ARGB32_Premultiplied);
    icon.fill(Qt::transparent);
    icon.setDevicePixelRatio(scale);

    QPainter painter(&icon);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.setRenderHint(QPainter::SmoothPixmapTransform);
    // The corner radius application icons have on the desktop: about a
    // fifth of the side.
    QPainterPath tile;
    tile.addRoundedRect(QRectF(0, 0, side, side), side * 0.225, side * 0.225);
    painter.fillPath(tile, Qt::white);
    painter.setClipPath(tile);
    if (!image.isNull()) {
        const QSizeF size = image.deviceIndependentSize();
        const qreal inner = side * 0.7;
        const qreal fit = std::min(inner / size.width(), inner / size.height());
        const QSizeF drawn = size * fit;
        painter.drawImage(
            QRectF(QPointF((side - drawn.width()) / 2, (side - drawn.height()) / 2), drawn), image);
    }
    return icon;
}

} // namespace platform::ApplicationIconImage
