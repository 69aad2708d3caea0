#include "platform/ui/Label.h"

#include <QFontDatabase>
#include <QFontMetricsF>
#include <QPainter>

namespace platform {

Label::Label(const QRectF& frame, QWidget* parent) : View(frame, parent) {
    setSystemFontOfSize(17);
}

void Label::setText(const QString& text) {
    text_ = text;
    setAccessibleName(text);
    update();
}

void Label::setTextColor(const QColor& colour) {
    textColor_ = colour;
    update();
}

void Label::setSystemFontOfSize(qreal points) {
    QFont systemFont = QFontDatabase::systemFont(QFontDatabase::GeneralFont);
    // Points here are the toolkit's device-independent points, which Qt
    // calls pixels.
    systemFont.setPixelSize(std::max(1, int(points + 0.5)));
    setFont(systemFont);
    update();
}

void Label::setTextAlignment(Qt::Alignment alignment) {
    alignment_ = alignment;
    update();
}

QSizeF Label::sizeThatFits(const QSizeF&) const {
    const QFontMetricsF metrics(font());
    return QSizeF(metrics.horizontalAdvance(text_), metrics.height());
}

void Label::paintEvent(QPaintEvent* event) {
    View::paintEvent(event);
    QPainter painter(this);
    painter.setPen(textColor_);
    const QRectF area = bounds();
    const QString shown = QFontMetricsF(font()).elidedText(text_, Qt::ElideRight, area.width());
    painter.drawText(area, int(alignment_) | Qt::TextSingleLine, shown);
}

} // namespace platform
