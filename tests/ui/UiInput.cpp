#include "ui/UiInput.h"

#include <QApplication>
#include <QKeyEvent>
#include <QMouseEvent>

namespace ui_input {

namespace {
void send(QWidget* widget, QEvent::Type type, const QPointF& at, Qt::MouseButton button,
          Qt::MouseButtons buttons) {
    const QPointF global = widget->mapToGlobal(at);
    QMouseEvent event(type, at, at, global, button, buttons, Qt::NoModifier);
    QApplication::sendEvent(widget, &event);
}
} // namespace

void press(QWidget* widget, const QPointF& at) {
    send(widget, QEvent::MouseButtonPress, at, Qt::LeftButton, Qt::LeftButton);
}

void move(QWidget* widget, const QPointF& at) {
    send(widget, QEvent::MouseMove, at, Qt::NoButton, Qt::LeftButton);
}

void release(QWidget* widget, const QPointF& at) {
    send(widget, QEvent::MouseButtonRelease, at, Qt::LeftButton, Qt::NoButton);
}

void tap(QWidget* widget, const QPointF& at) {
    press(widget, at);
    release(widget, at);
}

void key(QWidget* widget, int key, Qt::KeyboardModifiers modifiers) {
    QKeyEvent down(QEvent::KeyPress, key, modifiers);
    QApplication::sendEvent(widget, &down);
    QKeyEvent up(QEvent::KeyRelease, key, modifiers);
    QApplication::sendEvent(widget, &up);
}

} // namespace ui_input
