#include "platform/ui/TapRecognizer.h"

#include "platform/ui/Button.h"

#include <QApplication>
#include <QLineF>
#include <QMouseEvent>

namespace platform {

TapRecognizer::TapRecognizer(QWidget* view, Action action)
    : QObject(view), view_(view), action_(std::move(action)) {
    // Presses on the view's subviews go to the subviews, so the recogniser
    // listens application-wide and keeps what lands inside its view.
    qApp->installEventFilter(this);
}

TapRecognizer::~TapRecognizer() {
    if (qApp)
        qApp->removeEventFilter(this);
}

bool TapRecognizer::withinView(QWidget* target) const {
    return view_ && target && (target == view_ || view_->isAncestorOf(target));
}

bool TapRecognizer::blockedByButton(QWidget* target) const {
    for (QWidget* w = target; w && w != view_; w = w->parentWidget())
        if (auto* button = qobject_cast<Button*>(w);
            button && !button->passesTouchesToSuperviewRecognizers())
            return true;
    return false;
}

bool TapRecognizer::eventFilter(QObject* watched, QEvent* event) {
    const QEvent::Type type = event->type();
    if (type != QEvent::MouseButtonPress && type != QEvent::MouseButtonRelease &&
        type != QEvent::MouseMove)
        return false;
    auto* target = qobject_cast<QWidget*>(watched);
    if (!enabled_ || !withinView(target) || !view_->isVisible())
        return false;
    auto* mouse = static_cast<QMouseEvent*>(event);
    const QPointF global = mouse->globalPosition();

    // One event reaches the filter once per widget it is offered to (it
    // propagates up when ignored); only the first delivery counts.
    if (type == QEvent::MouseButtonPress) {
        if (mouse->button() == Qt::LeftButton && !tracking_ && !blockedByButton(target)) {
            tracking_ = true;
            pressGlobal_ = global;
        }
    } else if (type == QEvent::MouseMove) {
        if (tracking_ && QLineF(global, pressGlobal_).length() > AllowableMovement)
            tracking_ = false;
    } else if (tracking_ && mouse->button() == Qt::LeftButton) {
        tracking_ = false;
        if (QLineF(global, pressGlobal_).length() <= AllowableMovement) {
            location_ = view_->mapFromGlobal(global);
            QPointer<TapRecognizer> self(this);
            if (action_)
                action_(this);
            Q_UNUSED(self);
        }
    }
    return false;
}

} // namespace platform
