#pragma once

#include <QtGlobal>
#include <functional>

class QWidget;

namespace platform {

// Property animations of views. Only alpha is animatable.
//
// animateWithDuration runs `animations` at once, on the calling (main)
// thread. Every alpha set inside it (ViewAlpha::setAlpha, View::setAlpha)
// takes its new model value at once and moves on screen from its current
// on-screen value to the new one over `duration` seconds, easing in and out.
// A new animation of the same widget's alpha, or an immediate set, replaces a
// running one from where it stands.
//
// `completion` (may be empty) runs once on the main thread, always on a later
// turn of the event loop, never inside this call: with finished = true when
// every change of the block ran to its end, false when one was replaced or its
// widget destroyed. A block that changes nothing, or a duration <= 0, applies
// the values at once and completes with true on the next turn.
class Animation {
  public:
    static void animateWithDuration(double duration, const std::function<void()>& animations,
                                    std::function<void(bool finished)> completion = {});

    // True while an animations block runs on this thread.
    static bool inAnimationBlock();
    // Whether an alpha animation of the widget is running.
    static bool isAnimating(const QWidget* widget);

    // Used by ViewAlpha.
    static void addAlphaChange(QWidget* widget, qreal target);
    static void cancelAlphaAnimation(QWidget* widget);
};

} // namespace platform
