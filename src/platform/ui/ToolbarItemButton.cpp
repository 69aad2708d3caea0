#include "platform/ui/ToolbarItemButton.h"

#include "platform/ui/ToolbarItem.h"

#include <QFontMetrics>
#include <QKeyEvent>
#include <QPainter>

namespace platform {

ToolbarItemButton::ToolbarItemButton(std::shared_ptr<ToolbarItem> item, QWidget* parent)
    : QAbstractButton(parent), item_(std::move(item)) {
    setFocusPolicy(Qt::TabFocus);
    setCursor(Qt::PointingHandCursor);
    connect(this, &QAbstractButton::clicked, this, [this] { item_->trigger(); });
    connect(item_.get(), &ToolbarItem::changed, this, [this] { refresh(); });
    refresh();
}

void ToolbarItemButton::refresh() {
    setAccessibleName(item_->title());
    const QString key = item_->shortcut().toString(QKeySequence::NativeText);
    if (key.isEmpty()) {
        setToolTip(item_->showsIcon() ? item_->title() : QString());
        setAccessibleDescription(QString());
    } else {
        setToolTip(tr("%1 (%2)").arg(item_->title(), key));
        setAccessibleDescription(tr("Shortcut: %1").arg(key));
    }
    setEnabled(item_->isEnabled());
    QFont f = font();
    f.setBold(item_->isProminent());
    setFont(f);
    updateGeometry();
    update();
}

void ToolbarItemButton::setTint(const QColor& tint) {
    barTint_ = tint;
    update();
}

QColor ToolbarItemButton::effectiveTint() const {
    if (!isEnabled())
        return QColor(160, 160, 160);
    if (item_->tintColor().isValid())
        return item_->tintColor();
    return barTint_.isValid() ? barTint_ : palette().color(QPalette::Highlight);
}

QSize ToolbarItemButton::sizeHint() const {
    if (item_->showsIcon())
        return QSize(IconSide + 16, 44);
    const QFontMetrics metrics(font());
    return QSize(metrics.horizontalAdvance(item_->title()) + 16, 44);
}

void ToolbarItemButton::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.setRenderHint(QPainter::Antialiasing);
    QColor tint = effectiveTint();
    if (isDown())
        tint.setAlphaF(0.35f);
    const QRectF area = rect();

    if (item_->showsIcon()) {
        const QMarginsF insets = item_->imageInsets();
        QRectF slot = area.adjusted(insets.left(), insets.top(), -insets.right(), -insets.bottom());
        QRectF iconRect(0, 0, IconSide, IconSide);
        iconRect.moveCenter(slot.center());
        const qreal ratio = devicePixelRatioF();
        const QPixmap glyph = item_->icon().pixmap(QSize(IconSide, IconSide), ratio);
        // Icons are templates: their shape, painted in the tint. The mask is
        // laid pixel for pixel: drawn by its logical size, a glyph of a
        // denser screen would cover only part of the tint.
        QImage tinted(glyph.size(), QImage::Format_ARGB32_Premultiplied);
        tinted.fill(tint);
        QPainter mask(&tinted);
        mask.setCompositionMode(QPainter::CompositionMode_DestinationIn);
        mask.drawPixmap(QRect(QPoint(0, 0), glyph.size()), glyph);
        mask.end();
        tinted.setDevicePixelRatio(glyph.devicePixelRatio());
        painter.drawImage(iconRect, tinted);
    } else {
        painter.setPen(tint);
        painter.drawText(area, Qt::AlignCenter | Qt::TextSingleLine, item_->title());
    }
    if (hasFocus()) {
        QColor ring = palette().color(QPalette::Highlight);
        painter.setPen(QPen(ring, 2));
        painter.setBrush(Qt::NoBrush);
        painter.drawRoundedRect(area.adjusted(2, 6, -2, -6), 6, 6);
    }
}

void ToolbarItemButton::keyPressEvent(QKeyEvent* event) {
    switch (event->key()) {
    case Qt::Key_Left:
    case Qt::Key_Right:
    case Qt::Key_Up:
    case Qt::Key_Down:
        // A plain button would move the focus; in a bar over a movie the
        // arrows step through the movie instead.
        event->ignore();
        return;
    default:
        QAbstractButton::keyPressEvent(event);
    }
}

} // namespace platform
