// Draws the publishing activity's icon at 1x, 2x and 3x into the photo
// user-interface bundle:
//
//   make_activity_icon resources/System/Library/Frameworks/TamselPhotosUI.framework
//
// PublishVideoActivity: a monitor playing a recording, an arrow rising beside it, opaque black
// on transparent (the sheet tints it), 48 x 48 points.

#include <QImage>
#include <QPainter>
#include <QPainterPath>

#include "platform/ui/tools/ImageSetTool.h"

namespace {

constexpr double kSide = 48.0;

QImage icon(int scale) {
    QImage image(int(kSide * scale), int(kSide * scale), QImage::Format_ARGB32_Premultiplied);
    image.fill(Qt::transparent);
    QPainter painter(&image);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.scale(scale, scale);
    QPen pen(Qt::black, 3.0, Qt::SolidLine, Qt::RoundCap, Qt::RoundJoin);
    painter.setPen(pen);
    painter.setBrush(Qt::NoBrush);

    // A screen recording: a monitor on its stand, a play mark on it.
    painter.drawRoundedRect(QRectF(4, 10, 30, 22), 2, 2);
    painter.drawLine(QPointF(19, 32), QPointF(19, 38));
    painter.drawLine(QPointF(12, 38), QPointF(26, 38));
    QPainterPath play;
    play.moveTo(16, 16.5);
    play.lineTo(23.5, 21);
    play.lineTo(16, 25.5);
    play.closeSubpath();
    painter.setBrush(Qt::black);
    painter.drawPath(play);
    painter.setBrush(Qt::NoBrush);

    // Beside it, the arrow that sends it up.
    painter.drawLine(QPointF(41, 38), QPointF(41, 10));
    QPainterPath head;
    head.moveTo(36, 15);
    head.lineTo(41, 10);
    head.lineTo(46, 15);
    painter.drawPath(head);
    return image;
}

} // namespace

int main(int argc, char** argv) {
    return platform::tools::drawImageSet(argc, argv,
                                         {{QStringLiteral("PublishVideoActivity"), icon}});
}
