#pragma once

#include <QPointF>
#include <QWidget>

// Synthetic input for widget tests, delivered through QApplication so that
// application-wide event filters (tap recognisers) see it as they would see
// real input. Positions are in the widget's coordinates.
namespace ui_input {

void press(QWidget* widget, const QPointF& at);
void move(QWidget* widget, const QPointF& at); // with the left button held
void release(QWidget* widget, const QPointF& at);
void tap(QWidget* widget, const QPointF& at);
inline void tap(QWidget* widget) {
    tap(widget, QRectF(widget->rect()).center());
}
void key(QWidget* widget, int key, Qt::KeyboardModifiers modifiers = Qt::NoModifier);

} // namespace ui_input
