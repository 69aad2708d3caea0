// Keyboard: one focused part at a time, moved by frames.
#include "platform/ui/scrubber/MovieScrubber.h"

#include <QFocusEvent>
#include <QKeyEvent>
#include <cmath>

namespace platform {

namespace {

constexpr double kFallbackFrameDuration = 1.0 / 30.0;
// Tolerance for "already on a frame boundary", in frames.
constexpr double kFrameEpsilon = 1e-6;

// `frames` frames away from `seconds`, landing on frame boundaries: from
// between two frames the first step goes to the neighbouring boundary.
double stepFrames(double seconds, double frame, int frames) {
    if (frames > 0)
        return (std::floor(seconds / frame + kFrameEpsilon) + frames) * frame;
    return (std::ceil(seconds / frame - kFrameEpsilon) + frames) * frame;
}

} // namespace

QList<MovieScrubber::Handle> MovieScrubber::focusableParts() const {
    if (editable_)
        return {Handle::Playhead, Handle::Start, Handle::End};
    return {Handle::Playhead};
}

double MovieScrubber::effectiveFrameDuration() {
    if (frameDuration_ > 0.0)
        return frameDuration_;
    if (auto source = dataSource_.lock()) {
        const double frame = source->movieScrubberFrameDuration(this);
        if (std::isfinite(frame) && frame > 0.0)
            return frame;
    }
    return kFallbackFrameDuration;
}

double MovieScrubber::partTime(Handle part) const {
    switch (part) {
    case Handle::Start:
        return range_.start();
    case Handle::End:
        return range_.end();
    case Handle::Playhead:
        break;
    }
    return std::isfinite(value_) ? value_ : clampPlayhead(0.0);
}

bool MovieScrubber::moveFocusedPartTo(double seconds) {
    return movePartTo(focusPart_, seconds);
}

bool MovieScrubber::movePartTo(Handle part, double seconds) {
    if (!timeline_.hasMovie() || gesture_ != Gesture::None || !std::isfinite(seconds))
        return false;
    if (part == Handle::Playhead) {
        const double target = clampPlayhead(seconds);
        if (target == value_)
            return false;
        // A key press is a whole scrub: begin, the new value, end.
        gesture_ = Gesture::Playhead;
        if (auto delegate = delegate_.lock())
            delegate->movieScrubberDidBeginScrubbing_withHandle(this, Handle::Playhead);
        if (gesture_ == Gesture::Playhead)
            userSetValue(target);
        endGesture();
        return true;
    }
    if (!editable_)
        return false;
    const bool start = part == Handle::Start;
    const double target = start ? range_.clampStart(seconds) : range_.clampEnd(seconds);
    if (target == (start ? range_.start() : range_.end()))
        return false;
    if (!editing_ && !enterEditingByUser())
        return false;
    userSetHandle(part, target);
    return true;
}

bool MovieScrubber::stepPart(Handle part, int direction, bool large) {
    if (!timeline_.hasMovie() || direction == 0)
        return false;
    const double frame = effectiveFrameDuration();
    const int frames = large ? std::max(10, static_cast<int>(std::lround(1.0 / frame))) : 1;
    return movePartTo(part, stepFrames(partTime(part), frame, direction < 0 ? -frames : frames));
}

bool MovieScrubber::trimHandleTo(Handle handle, double seconds) {
    if (handle == Handle::Playhead || !editable_ || !timeline_.hasMovie() ||
        gesture_ != Gesture::None || !std::isfinite(seconds))
        return false;
    // As a press on the handle: editing begins before anything moves.
    if (!editing_ && !enterEditingByUser())
        return false;
    userSetHandle(handle,
                  handle == Handle::Start ? range_.clampStart(seconds) : range_.clampEnd(seconds));
    return true;
}

void MovieScrubber::keyPressEvent(QKeyEvent* event) {
    if (!timeline_.hasMovie()) {
        QWidget::keyPressEvent(event);
        return;
    }
    const bool large = event->modifiers().testFlag(Qt::ShiftModifier);

    switch (event->key()) {
    case Qt::Key_Left:
        stepPart(focusPart_, -1, large);
        break;
    case Qt::Key_Right:
        stepPart(focusPart_, 1, large);
        break;
    case Qt::Key_Home:
        moveFocusedPartTo(0.0);
        break;
    case Qt::Key_End:
        moveFocusedPartTo(timeline_.duration());
        break;
    case Qt::Key_Escape:
        if (!editing_) {
            QWidget::keyPressEvent(event);
            return;
        }
        setEditing_animated(false, true);
        if (auto delegate = delegate_.lock())
            delegate->movieScrubberDidCancelEditing(this);
        break;
    default:
        QWidget::keyPressEvent(event);
        return;
    }
    event->accept();
}

void MovieScrubber::focusInEvent(QFocusEvent* event) {
    const QList<Handle> parts = focusableParts();
    if (event->reason() == Qt::TabFocusReason)
        focusPart_ = parts.first();
    else if (event->reason() == Qt::BacktabFocusReason)
        focusPart_ = parts.last();
    else if (!parts.contains(focusPart_))
        focusPart_ = Handle::Playhead;
    update();
    notifyValueChanged();
    QWidget::focusInEvent(event);
}

void MovieScrubber::focusOutEvent(QFocusEvent* event) {
    update();
    QWidget::focusOutEvent(event);
}

bool MovieScrubber::focusNextPrevChild(bool next) {
    if (hasFocus()) {
        const QList<Handle> parts = focusableParts();
        const qsizetype to = parts.indexOf(focusPart_) + (next ? 1 : -1);
        if (to >= 0 && to < parts.size()) {
            focusPart_ = parts[to];
            update();
            notifyValueChanged();
            return true;
        }
    }
    const bool moved = QWidget::focusNextPrevChild(next);
    if (hasFocus()) {
        // The only stop in the window: focus stays, so wrap around inside.
        const QList<Handle> parts = focusableParts();
        focusPart_ = next ? parts.first() : parts.last();
        update();
        notifyValueChanged();
        return true;
    }
    return moved;
}

} // namespace platform
