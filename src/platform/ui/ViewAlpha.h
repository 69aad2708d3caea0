#pragma once

#include <QtGlobal>

class QWidget;

namespace platform {

// The alpha of any widget, as the toolkit's views have it: the model value
// that code sets and reads, and the presentation value on screen, which
// differs from the model only while an animation runs. 1.0 is opaque, 0.0
// invisible; values are clamped to [0, 1]. Main thread only.
//
// A widget whose on-screen alpha is below 0.01 lets mouse events through to
// what lies beneath, as an invisible view should.
namespace ViewAlpha {

qreal alpha(const QWidget* widget);
// Inside an Animation block the change is animated from the on-screen value;
// outside, it takes effect at once and stops any alpha animation running on
// the widget.
void setAlpha(QWidget* widget, qreal alpha);

qreal presentationAlpha(const QWidget* widget);
// Sets only what is on screen; the animation machinery drives this.
void setPresentationAlpha(QWidget* widget, qreal alpha);

} // namespace ViewAlpha
} // namespace platform
