// Draws the overlay play button's two mask images at 1x, 2x and 3x into a
// framework bundle directory:
//
//   make_mask_images resources/System/Library/Frameworks/Tamsel.framework
//
// TXVideoOverlayBackgroundMask: opaque outside the button's round shape and
// transparent inside it, so drawing it in destination-out mode keeps a disc.
// TXVideoOverlayGlyphMask: the play triangle, opaque black on transparent,
// the same size as the background mask. Both are 80 x 80 points.

#include <QImage>
#include <QPainter>
#include <QPainterPath>

#include "platform/ui/tools/ImageSetTool.h"

namespace {

constexpr double kSide = 80.0;

QImage canvas(int scale) {
    QImage image(int(kSide * scale), int(kSide * scale), QImage::Format_ARGB32_Premultiplied);
    image.fill(Qt::transparent);
    return image;
}

QImage backgroundMask(int scale) {
    QImage image = canvas(scale);
    image.fill(Qt::black);
    QPainter painter(&image);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.scale(scale, scale);
    painter.setCompositionMode(QPainter::CompositionMode_DestinationOut);
    painter.setPen(Qt::NoPen);
    painter.setBrush(Qt::black);
    painter.drawEllipse(QRectF(0, 0, kSide, kSide));
    return image;
}

QImage glyphMask(int scale) {
    QImage image = canvas(scale);
    QPainter painter(&image);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.scale(scale, scale);
    // The triangle's centroid sits on the disc's centre, which is where the
    // eye puts the middle of a play glyph.
    QPainterPath triangle;
    triangle.moveTo(30, 22);
    triangle.lineTo(60, 40);
    triangle.lineTo(30, 58);
    triangle.closeSubpath();
    painter.fillPath(triangle, Qt::black);
    return image;
}

} // namespace

int main(int argc, char** argv) {
    return platform::tools::drawImageSet(
        argc, argv,
        {{QStringLiteral("TXVideoOverlayBackgroundMask"), backgroundMask},
         {QStringLiteral("TXVideoOverlayGlyphMask"), glyphMask}});
}
