// Draws the publishing activity's icon at 1x, 2x and 3x into the photo
// user-interface bundle:
//
//   make_activity_icon resources/System/Library/Frameworks/TamselPhotosUI.framework
//
// PublishVideoActivity: a monitor playing a recording, an arrow rising beside it, opaque black
// on transparent (the sheet tints it), 48 x 48 points.

#include <QDir>
#include <QGuiApplication>
#include <QImage>
#include <QPainter>
#include <QPainterPath>
#include <cstdio>

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

bool save(const QImage& image, const QString& directory, const QString& name, int scale) {
    const QString file = directory + QLatin1Char('/') + name +
                         (scale == 1 ? QString() : QStringLiteral("@%1x").arg(scale)) +
                         QStringLiteral(".png");
    if (!image.save(file, "PNG")) {
        std::fprintf(stderr, "cannot write %s\n", qPrintable(file));
        return false;
    }
    return true;
}

} // namespace

int main(int argc, char** argv) {
    QGuiApplication app(argc, argv);
    if (argc != 2) {
        std::fprintf(stderr, "usage: %s FRAMEWORK_DIRECTORY\n", argv[0]);
        return 2;
    }
    const QString directory = QString::fromLocal8Bit(argv[1]);
    if (!QDir().mkpath(directory)) {
        std::fprintf(stderr, "cannot create %s\n", argv[1]);
        return 1;
    }
    for (int scale = 1; scale <= 3; ++scale)
        if (!save(icon(scale), directory, QStringLiteral("PublishVideoActivity"), scale))
            return 1;
    return 0;
}
