#include "platform/ui/SystemIcons.h"

#include <QPainter>
#include <QPainterPath>
#include <QPixmap>

namespace platform::SystemIcons {

QString themeName(Glyph glyph) {
    switch (glyph) {
    case Glyph::Play:
        return QStringLiteral("media-playback-start");
    case Glyph::Pause:
        return QStringLiteral("media-playback-pause");
    case Glyph::Share:
        return QStringLiteral("document-send");
    case Glyph::Undo:
        return QStringLiteral("edit-undo");
    }
    return {};
}

namespace {

// Draws the glyph into a square of side `s` pixels.
void drawGlyph(QPainter& p, Glyph glyph, qreal s) {
    p.setRenderHint(QPainter::Antialiasing);
    const QColor ink(Qt::black);
    switch (glyph) {
    case Glyph::Play: {
        QPainterPath path;
        path.moveTo(s * 0.28, s * 0.18);
        path.lineTo(s * 0.82, s * 0.5);
        path.lineTo(s * 0.28, s * 0.82);
        path.closeSubpath();
        p.fillPath(path, ink);
        break;
    }
    case Glyph::Pause:
        p.fillRect(QRectF(s * 0.25, s * 0.18, s * 0.17, s * 0.64), ink);
        p.fillRect(QRectF(s * 0.58, s * 0.18, s * 0.17, s * 0.64), ink);
        break;
    case Glyph::Share: {
        QPen pen(ink, std::max(1.0, s * 0.07), Qt::SolidLine, Qt::RoundCap, Qt::RoundJoin);
        p.setPen(pen);
        // An open box with an arrow leaving it upwards.
        QPainterPath box;
        box.moveTo(s * 0.36, s * 0.42);
        box.lineTo(s * 0.22, s * 0.42);
        box.lineTo(s * 0.22, s * 0.88);
        box.lineTo(s * 0.78, s * 0.88);
        box.lineTo(s * 0.78, s * 0.42);
        box.lineTo(s * 0.64, s * 0.42);
        p.drawPath(box);
        p.drawLine(QPointF(s * 0.5, s * 0.1), QPointF(s * 0.5, s * 0.62));
        p.drawLine(QPointF(s * 0.5, s * 0.1), QPointF(s * 0.36, s * 0.24));
        p.drawLine(QPointF(s * 0.5, s * 0.1), QPointF(s * 0.64, s * 0.24));
        break;
    }
    case Glyph::Undo: {
        QPen pen(ink, std::max(1.0, s * 0.08), Qt::SolidLine, Qt::RoundCap, Qt::RoundJoin);
        p.setPen(pen);
        QPainterPath arc;
        arc.moveTo(s * 0.25, s * 0.45);
        arc.cubicTo(s * 0.45, s * 0.2, s * 0.85, s * 0.3, s * 0.8, s * 0.62);
        arc.cubicTo(s * 0.77, s * 0.8, s * 0.6, s * 0.84, s * 0.45, s * 0.82);
        p.drawPath(arc);
        QPainterPath head;
        head.moveTo(s * 0.15, s * 0.3);
        head.lineTo(s * 0.4, s * 0.52);
        head.lineTo(s * 0.13, s * 0.6);
        head.closeSubpath();
        p.setPen(Qt::NoPen);
        p.fillPath(head, ink);
        break;
    }
    }
}

} // namespace

QIcon drawnIcon(Glyph glyph) {
    QIcon icon;
    for (int side : {16, 22, 24, 32, 44, 48, 66, 96}) {
        QPixmap pixmap(side, side);
        pixmap.fill(Qt::transparent);
        QPainter painter(&pixmap);
        drawGlyph(painter, glyph, side);
        painter.end();
        icon.addPixmap(pixmap);
    }
    return icon;
}

QIcon icon(Glyph glyph) {
    const QIcon themed = QIcon::fromTheme(themeName(glyph));
    return themed.isNull() ? drawnIcon(glyph) : themed;
}

} // namespace platform::SystemIcons
