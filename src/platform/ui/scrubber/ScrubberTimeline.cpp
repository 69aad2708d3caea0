#include "platform/ui/scrubber/ScrubberTimeline.h"

#include <algorithm>
#include <cmath>

namespace platform {

double TimelineMapping::timeForX(double x) const {
    return isUsable() ? (x - origin) / pixelsPerSecond : 0.0;
}

TimelineMapping TimelineMapping::blend(const TimelineMapping& from, const TimelineMapping& to,
                                       double progress) {
    // Blending both coefficients linearly blends every point's x, so a point
    // both mappings agree on does not move during the animation.
    const double p = std::clamp(progress, 0.0, 1.0);
    return {from.origin + (to.origin - from.origin) * p,
            from.pixelsPerSecond + (to.pixelsPerSecond - from.pixelsPerSecond) * p};
}

void ScrubberTimeline::setDuration(double seconds) {
    duration_ = std::isfinite(seconds) && seconds > 0.0 ? seconds : 0.0;
    zoomed_ = false;
}

void ScrubberTimeline::setTrack(double left, double width) {
    trackLeft_ = std::isfinite(left) ? left : 0.0;
    trackWidth_ = std::isfinite(width) && width > 0.0 ? width : 0.0;
    zoomed_ = false;
}

TimelineMapping ScrubberTimeline::overview() const {
    if (!hasMovie() || trackWidth_ <= 0.0)
        return {};
    return {trackLeft_, trackWidth_ / duration_};
}

void ScrubberTimeline::zoomAround(double anchorTime, double anchorX, double factor) {
    const TimelineMapping base = overview();
    if (!base.isUsable() || !(factor > 1.0) || !std::isfinite(anchorTime) ||
        !std::isfinite(anchorX))
        return;
    zoom_.pixelsPerSecond = base.pixelsPerSecond * factor;
    zoom_.origin = anchorX - zoom_.pixelsPerSecond * anchorTime;
    zoomed_ = true;
}

double ScrubberTimeline::clampToMovie(double seconds) const {
    if (!std::isfinite(seconds))
        return 0.0;
    return std::clamp(seconds, 0.0, duration_);
}

} // namespace platform
