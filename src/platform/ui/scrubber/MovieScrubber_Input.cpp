// Pointer input: mouse and touch drive the same gestures.
#include "platform/ui/scrubber/MovieScrubber.h"

#include <QMouseEvent>
#include <QTouchEvent>
#include <algorithm>
#include <cmath>

namespace platform {

namespace {

// How far outside a handle a press still takes it; fingers are blunter.
constexpr double kMouseSlop = 4.0;
constexpr double kTouchSlop = 12.0;
// A held handle whose pointer wanders less than this still counts as held
// still, so a trembling hand still gets the zoom.
constexpr double kHoldTolerance = 3.0;

MovieScrubberHandle handleOf(bool start) {
    return start ? MovieScrubberHandle::Start : MovieScrubberHandle::End;
}

} // namespace

MovieScrubber::Gesture MovieScrubber::hitTest(double x, bool touch) const {
    if (!timeline_.hasMovie())
        return Gesture::None;
    if (editable_) {
        const TimelineMapping map = timeline_.active();
        const double slop = touch ? kTouchSlop : kMouseSlop;
        // Outside editing the handles stand in the inset; reaching into the
        // strip would take clicks meant for the playhead at the movie's ends.
        const double inner = editing_ ? slop : 0.0;
        const double width = handleWidth();
        const double xs = map.xForTime(range_.start());
        const double xe = map.xForTime(range_.end());
        const bool inStart = x >= xs - width - slop && x <= xs + inner;
        const bool inEnd = x >= xe - inner && x <= xe + width + slop;
        if (inStart && inEnd)
            return std::abs(x - (xs - width / 2)) <= std::abs(x - (xe + width / 2)) ? Gesture::Start
                                                                                    : Gesture::End;
        if (inStart)
            return Gesture::Start;
        if (inEnd)
            return Gesture::End;
    }
    return Gesture::Playhead;
}

void MovieScrubber::beginGesture(double x, bool touch) {
    if (gesture_ != Gesture::None)
        return;
    const Gesture hit = hitTest(x, touch);
    if (hit == Gesture::None)
        return;
    pointerX_ = x;
    holdOriginX_ = x;

    if (hit == Gesture::Playhead) {
        gesture_ = Gesture::Playhead;
        focusPart_ = Handle::Playhead;
        if (auto delegate = delegate_.lock())
            delegate->movieScrubberDidBeginScrubbing_withHandle(this, Handle::Playhead);
        if (gesture_ == Gesture::Playhead) // unless the delegate reloaded us
            userSetValue(timeline_.active().timeForX(x));
        return;
    }

    const bool start = hit == Gesture::Start;
    gesture_ = hit;
    focusPart_ = handleOf(start);
    grabOffset_ = x - timeline_.active().xForTime(start ? range_.start() : range_.end());
    if (!editing_ && !enterEditingByUser()) {
        gesture_ = Gesture::None;
        return;
    }
    if (gesture_ == hit && zoomDelay_ > 0.0 && zoomFactor_ > 1.0)
        zoomTimer_.start(static_cast<int>(std::lround(zoomDelay_ * 1000.0)));
    update();
    notifyValueChanged();
}

void MovieScrubber::moveGesture(double x) {
    pointerX_ = x;
    switch (gesture_) {
    case Gesture::None:
        return;
    case Gesture::Playhead:
        userSetValue(timeline_.active().timeForX(x));
        return;
    case Gesture::Start:
    case Gesture::End:
        if (!timeline_.isZoomed() && zoomTimer_.isActive() &&
            std::abs(x - holdOriginX_) > kHoldTolerance) {
            holdOriginX_ = x;
            zoomTimer_.start();
        }
        userSetHandle(handleOf(gesture_ == Gesture::Start),
                      timeline_.active().timeForX(x - grabOffset_));
        return;
    }
}

void MovieScrubber::endGesture() {
    const Gesture ended = gesture_;
    if (ended == Gesture::None)
        return;
    gesture_ = Gesture::None;
    touchPointId_ = -1;
    zoomTimer_.stop();
    if (ended == Gesture::Playhead) {
        if (auto delegate = delegate_.lock())
            delegate->movieScrubberDidEndScrubbing_withHandle(this, Handle::Playhead);
    } else if (timeline_.isZoomed()) {
        zoomOut();
    }
    update();
}

void MovieScrubber::zoomIn() {
    if ((gesture_ != Gesture::Start && gesture_ != Gesture::End) || timeline_.isZoomed())
        return;
    const double anchorTime = gesture_ == Gesture::Start ? range_.start() : range_.end();
    const double anchorX = timeline_.overview().xForTime(anchorTime);
    timeline_.zoomAround(anchorTime, anchorX, zoomFactor_);
    if (!timeline_.isZoomed())
        return;
    // The handle stays where it is; the pointer keeps its distance to it.
    grabOffset_ = pointerX_ - anchorX;

    const TimelineMapping& zoom = timeline_.zoomMapping();
    const double from = timeline_.clampToMovie(zoom.timeForX(timeline_.trackLeft()));
    const double to = timeline_.clampToMovie(zoom.timeForX(timeline_.trackRight()));
    zoomed_ = {};
    if (to > from) {
        const double span = zoom.xForTime(to) - zoom.xForTime(from);
        const int count = thumbnailCount(span);
        if (auto source = dataSource_.lock()) {
            const unsigned generation = ++generation_;
            const QList<double> stamps =
                source->movieScrubber_evenlySpacedTimestamps_startingAt_endingAt(this, count, from,
                                                                                 to);
            if (generation != generation_ || !timeline_.isZoomed())
                return; // reloaded from inside the call
            zoomed_ = ThumbnailStrip(from, to, count, stamps);
            zoomed_.adoptImages(overview_);
            requestThumbnails(zoomed_, zoomed_.timestamps());
        }
    }
    if (timeline_.isZoomed())
        animateZoom(1.0);
}

void MovieScrubber::zoomOut() {
    timeline_.unzoom();
    animateZoom(0.0);
}

bool MovieScrubber::enterEditingByUser() {
    setEditing_animated(true, true);
    if (!editing_)
        return false;
    if (auto delegate = delegate_.lock())
        delegate->movieScrubberDidBeginEditing(this);
    return editing_;
}

double MovieScrubber::clampPlayhead(double seconds) const {
    if (editing_)
        return std::clamp(timeline_.clampToMovie(seconds), range_.start(), range_.end());
    return timeline_.clampToMovie(seconds);
}

void MovieScrubber::userSetValue(double seconds) {
    const double next = clampPlayhead(seconds);
    if (next == value_)
        return;
    value_ = next;
    update();
    notifyValueChanged();
    if (auto delegate = delegate_.lock())
        delegate->movieScrubber_valueDidChange(this, next);
}

void MovieScrubber::userSetHandle(Handle handle, double seconds) {
    const bool start = handle == Handle::Start;
    if (!(start ? range_.setStart(seconds) : range_.setEnd(seconds)))
        return;
    update();
    notifyValueChanged();
    auto delegate = delegate_.lock();
    if (!delegate)
        return;
    if (start)
        delegate->movieScrubber_editingStartValueDidChange(this, range_.start());
    else
        delegate->movieScrubber_editingEndValueDidChange(this, range_.end());
}

bool MovieScrubber::event(QEvent* event) {
    switch (event->type()) {
    case QEvent::TouchBegin:
    case QEvent::TouchUpdate:
    case QEvent::TouchEnd: {
        auto* touch = static_cast<QTouchEvent*>(event);
        const QList<QEventPoint>& points = touch->points();
        if (event->type() == QEvent::TouchBegin) {
            if (points.isEmpty())
                return true;
            setFocus(Qt::MouseFocusReason);
            beginGesture(points.first().position().x(), true);
            touchPointId_ = gesture_ != Gesture::None ? points.first().id() : -1;
            event->accept();
            return true;
        }
        for (const QEventPoint& point : points) {
            if (point.id() != touchPointId_)
                continue;
            moveGesture(point.position().x());
            if (point.state() == QEventPoint::Released)
                endGesture();
        }
        if (event->type() == QEvent::TouchEnd)
            endGesture();
        event->accept();
        return true;
    }
    case QEvent::TouchCancel:
        endGesture();
        event->accept();
        return true;
    case QEvent::EnabledChange:
        // A disabled widget gets no release; end what the press began.
        if (!isEnabled())
            endGesture();
        return QWidget::event(event);
    default:
        return QWidget::event(event);
    }
}

void MovieScrubber::mousePressEvent(QMouseEvent* event) {
    if (event->button() != Qt::LeftButton) {
        QWidget::mousePressEvent(event);
        return;
    }
    beginGesture(event->position().x(), false);
    event->accept();
}

void MovieScrubber::mouseMoveEvent(QMouseEvent* event) {
    if (gesture_ == Gesture::None) {
        const Gesture over = hitTest(event->position().x(), false);
        setCursor(over == Gesture::Start || over == Gesture::End ? Qt::SizeHorCursor
                                                                 : Qt::ArrowCursor);
        return;
    }
    moveGesture(event->position().x());
    event->accept();
}

void MovieScrubber::mouseReleaseEvent(QMouseEvent* event) {
    if (event->button() != Qt::LeftButton || gesture_ == Gesture::None) {
        QWidget::mouseReleaseEvent(event);
        return;
    }
    moveGesture(event->position().x());
    endGesture();
    event->accept();
}

void MovieScrubber::hideEvent(QHideEvent* event) {
    // A gesture cut short must still be ended, or the owner waits forever
    // for the end call.
    endGesture();
    QWidget::hideEvent(event);
}

} // namespace platform
