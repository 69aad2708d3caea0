#include "platform/ui/ViewAlpha.h"

#include "platform/ui/Animation.h"

#include <QGraphicsOpacityEffect>
#include <QVariant>
#include <QWidget>
#include <algorithm>

namespace platform::ViewAlpha {

namespace {

constexpr const char* kModelAlpha = "tamsel.alpha";
constexpr const char* kMadeTransparent = "tamsel.alphaPassesMouse";

qreal clamped(qreal value) {
    return std::clamp(value, 0.0, 1.0);
}

} // namespace

qreal alpha(const QWidget* widget) {
    if (!widget)
        return 0.0;
    const QVariant model = widget->property(kModelAlpha);
    return model.isValid() ? model.toReal() : 1.0;
}

qreal presentationAlpha(const QWidget* widget) {
    if (!widget)
        return 0.0;
    if (auto* effect = qobject_cast<QGraphicsOpacityEffect*>(widget->graphicsEffect()))
        return effect->opacity();
    return 1.0;
}

void setPresentationAlpha(QWidget* widget, qreal value) {
    if (!widget)
        return;
    value = clamped(value);
    auto* effect = qobject_cast<QGraphicsOpacityEffect*>(widget->graphicsEffect());
    if (value >= 1.0) {
        // An opacity effect makes Qt paint the widget off-screen first; an
        // opaque widget does not need that.
        if (effect)
            widget->setGraphicsEffect(nullptr);
    } else {
        if (!effect) {
            effect = new QGraphicsOpacityEffect(widget);
            widget->setGraphicsEffect(effect);
        }
        effect->setOpacity(value);
    }

    const bool invisible = value < 0.01;
    const bool madeTransparent = widget->property(kMadeTransparent).toBool();
    if (invisible && !madeTransparent && !widget->testAttribute(Qt::WA_TransparentForMouseEvents)) {
        widget->setAttribute(Qt::WA_TransparentForMouseEvents, true);
        widget->setProperty(kMadeTransparent, true);
    } else if (!invisible && madeTransparent) {
        // A view whose interaction was switched off meanwhile stays so.
        if (!widget->property("tamsel.interactionDisabled").toBool())
            widget->setAttribute(Qt::WA_TransparentForMouseEvents, false);
        widget->setProperty(kMadeTransparent, false);
    }
}

void setAlpha(QWidget* widget, qreal value) {
    if (!widget)
        return;
    value = clamped(value);
    widget->setProperty(kModelAlpha, value);
    if (Animation::inAnimationBlock()) {
        Animation::addAlphaChange(widget, value);
        return;
    }
    Animation::cancelAlphaAnimation(widget);
    setPresentationAlpha(widget, value);
}

} // namespace platform::ViewAlpha
