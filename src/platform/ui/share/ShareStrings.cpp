#include "ShareStrings.h"

#include "platform/services/Bundle.h"

#include <QGuiApplication>
#include <QIcon>
#include <QPainter>
#include <QPainterPath>

namespace platform::ShareStrings {

namespace {
const QString kFrameworkPath = QStringLiteral("/System/Library/Frameworks/Tamsel.framework");
constexpr int kIconSize = 32;
} // namespace

QString text(const char* key, const char* fallback) {
    const QString name = QString::fromLatin1(key);
    if (auto bundle = Bundle::bundleWithPath(kFrameworkPath)) {
        const QString found =
            bundle->localizedStringForKey(name, QString(), QStringLiteral("Localizable"));
        if (found != name)
            return found;
    }
    return QString::fromUtf8(fallback);
}

namespace {

void drawGlyph(QPainter& painter, Glyph glyph, const QString& title) {
    QPen pen(Qt::white, 2.0, Qt::SolidLine, Qt::RoundCap, Qt::RoundJoin);
    painter.setPen(pen);
    painter.setBrush(Qt::NoBrush);
    switch (glyph) {
    case Glyph::Mail:
        painter.drawRoundedRect(QRectF(7, 10, 18, 13), 2, 2);
        painter.drawPolyline(QPolygonF({QPointF(7.5, 11), QPointF(16, 18), QPointF(24.5, 11)}));
        return;
    case Glyph::Phone:
        painter.drawRoundedRect(QRectF(11, 6, 10, 20), 2.5, 2.5);
        painter.drawLine(QPointF(15, 22.5), QPointF(17, 22.5));
        return;
    case Glyph::Copy:
        painter.drawRoundedRect(QRectF(12, 12, 12, 13), 2, 2);
        painter.drawPolyline(QPolygonF(
            {QPointF(9, 20), QPointF(8, 20), QPointF(8, 7), QPointF(20, 7), QPointF(20, 9)}));
        return;
    case Glyph::Save:
        painter.drawLine(QPointF(16, 7), QPointF(16, 19));
        painter.drawPolyline(QPolygonF({QPointF(11, 14), QPointF(16, 19), QPointF(21, 14)}));
        painter.drawPolyline(
            QPolygonF({QPointF(8, 19), QPointF(8, 25), QPointF(24, 25), QPointF(24, 19)}));
        return;
    case Glyph::Folder: {
        QPainterPath folder;
        folder.moveTo(7, 10);
        folder.lineTo(13, 10);
        folder.lineTo(15, 12);
        folder.lineTo(25, 12);
        folder.lineTo(25, 24);
        folder.lineTo(7, 24);
        folder.closeSubpath();
        painter.drawPath(folder);
        return;
    }
    case Glyph::Facebook:
    case Glyph::Initial:
        break;
    }
    QFont font = painter.font();
    font.setBold(true);
    font.setPixelSize(glyph == Glyph::Facebook ? 22 : kIconSize / 2);
    painter.setFont(font);
    painter.drawText(QRectF(0, glyph == Glyph::Facebook ? 3 : 0, kIconSize, kIconSize),
                     Qt::AlignCenter,
                     glyph == Glyph::Facebook ? QStringLiteral("f") : title.left(1).toUpper());
}

} // namespace

QImage icon(const QStringList& themeNames, const QString& title, const QColor& tint, Glyph glyph) {
    const qreal scale = qGuiApp ? qGuiApp->devicePixelRatio() : 1.0;
    for (const QString& name : themeNames) {
        const QIcon themed = QIcon::fromTheme(name);
        if (!themed.isNull()) {
            QImage image = themed.pixmap(QSize(kIconSize, kIconSize), scale).toImage();
            if (!image.isNull())
                return image;
        }
    }
    // No theme on this desktop: a tile that still tells the rows apart.
    QImage tile(QSize(kIconSize, kIconSize) * scale, QImage::Format_ARGB32_Premultiplied);
    tile.setDevicePixelRatio(scale);
    tile.fill(Qt::transparent);
    QPainter painter(&tile);
    painter.setRenderHint(QPainter::Antialiasing);
    QPainterPath shape;
    shape.addRoundedRect(QRectF(0, 0, kIconSize, kIconSize), 8, 8);
    painter.fillPath(shape, tint);
    drawGlyph(painter, glyph, title);
    return tile;
}

} // namespace platform::ShareStrings
