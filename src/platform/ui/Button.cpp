#include "platform/ui/Button.h"

#include "platform/ui/View.h"

#include <QKeyEvent>
#include <QMouseEvent>
#include <QPainter>
#include <QPointer>

namespace platform {

Button::Button(const QRectF& frame, QWidget* parent) : QAbstractButton(parent) {
    setFocusPolicy(Qt::StrongFocus);
    View::setFrameOf(this, frame);
}

void Button::setImage(const QImage& image, State state) {
    images_.insert(state, image);
    update();
}

QImage Button::currentImage() const {
    if (isDown()) {
        const QImage highlighted = images_.value(State::Highlighted);
        if (!highlighted.isNull())
            return highlighted;
    }
    return images_.value(State::Normal);
}

void Button::sizeToFit() {
    QRectF frame = View::frameOf(this);
    frame.setSize(images_.value(State::Normal).deviceIndependentSize());
    View::setFrameOf(this, frame);
}

QSize Button::sizeHint() const {
    return images_.value(State::Normal).deviceIndependentSize().toSize();
}

void Button::addHandler(ControlEvent event, Handler handler) {
    if (handler)
        handlers_[event].append(std::move(handler));
}

void Button::send(ControlEvent event) {
    // A handler may delete the button; copy the list and watch for that.
    const QList<Handler> handlers = handlers_.value(event);
    QPointer<Button> self(this);
    for (const Handler& handler : handlers) {
        if (!self)
            return;
        handler(this);
    }
}

void Button::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.setRenderHint(QPainter::SmoothPixmapTransform);
    const QImage image = currentImage();
    const QRectF area(QPointF(0, 0), QSizeF(size()));
    if (!image.isNull())
        painter.drawImage(area, image);
    if (isDown() && images_.value(State::Highlighted).isNull() && !image.isNull()) {
        painter.setCompositionMode(QPainter::CompositionMode_SourceAtop);
        painter.fillRect(area, QColor(0, 0, 0, 80));
    }
    if (hasFocus()) {
        painter.setCompositionMode(QPainter::CompositionMode_SourceOver);
        QPen pen(palette().color(QPalette::Highlight), 2);
        painter.setPen(pen);
        painter.setBrush(Qt::NoBrush);
        painter.drawRoundedRect(area.adjusted(1, 1, -1, -1), 4, 4);
    }
}

void Button::mousePressEvent(QMouseEvent* event) {
    if (event->button() != Qt::LeftButton) {
        event->ignore();
        return;
    }
    tracking_ = true;
    setDown(true);
    event->accept();
    send(ControlEvent::TouchDown);
}

void Button::mouseMoveEvent(QMouseEvent* event) {
    if (!tracking_) {
        event->ignore();
        return;
    }
    const bool inside = hitButton(event->position().toPoint());
    setDown(inside);
    event->accept();
    send(inside ? ControlEvent::TouchDragInside : ControlEvent::TouchDragOutside);
}

void Button::mouseReleaseEvent(QMouseEvent* event) {
    if (!tracking_ || event->button() != Qt::LeftButton) {
        event->ignore();
        return;
    }
    tracking_ = false;
    const bool inside = hitButton(event->position().toPoint());
    setDown(false);
    event->accept();
    if (inside) {
        send(ControlEvent::TouchUpInside);
        // Keeps QAbstractButton's own signal for code that listens to it.
        emit clicked(false);
    } else {
        send(ControlEvent::TouchUpOutside);
    }
}

void Button::keyPressEvent(QKeyEvent* event) {
    const bool activates = event->key() == Qt::Key_Space || event->key() == Qt::Key_Return ||
                           event->key() == Qt::Key_Enter;
    if (!activates || event->isAutoRepeat()) {
        if (!activates)
            QAbstractButton::keyPressEvent(event);
        return;
    }
    keyDown_ = true;
    setDown(true);
    send(ControlEvent::TouchDown);
}

void Button::keyReleaseEvent(QKeyEvent* event) {
    const bool activates = event->key() == Qt::Key_Space || event->key() == Qt::Key_Return ||
                           event->key() == Qt::Key_Enter;
    if (!activates || event->isAutoRepeat() || !keyDown_) {
        if (!activates)
            QAbstractButton::keyReleaseEvent(event);
        return;
    }
    keyDown_ = false;
    setDown(false);
    send(ControlEvent::TouchUpInside);
    emit clicked(false);
}

void Button::press() {
    if (!isEnabled())
        return;
    QPointer<Button> self(this);
    send(ControlEvent::TouchDown);
    if (!self)
        return;
    send(ControlEvent::TouchUpInside);
    if (self)
        emit clicked(false);
}

void Button::focusOutEvent(QFocusEvent* event) {
    if (keyDown_ || tracking_) {
        keyDown_ = tracking_ = false;
        setDown(false);
        send(ControlEvent::TouchCancel);
    }
    QAbstractButton::focusOutEvent(event);
}

} // namespace platform
