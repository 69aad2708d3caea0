#include "platform/ui/scrubber/TrimRange.h"

#include <algorithm>
#include <cmath>

namespace platform {

void TrimRange::reset(double duration) {
    duration_ = std::isfinite(duration) && duration > 0.0 ? duration : 0.0;
    start_ = 0.0;
    end_ = duration_;
}

void TrimRange::refit(double duration) {
    duration_ = std::isfinite(duration) && duration > 0.0 ? duration : 0.0;
    enforce();
}

void TrimRange::setMinimumLength(double seconds) {
    minimumLength_ = std::isfinite(seconds) && seconds > 0.0 ? seconds : 0.0;
    enforce();
}

double TrimRange::effectiveMinimum() const {
    return std::min(minimumLength_, duration_);
}

double TrimRange::clampStart(double seconds) const {
    if (!std::isfinite(seconds))
        return start_;
    return std::clamp(seconds, 0.0, std::max(0.0, end_ - effectiveMinimum()));
}

double TrimRange::clampEnd(double seconds) const {
    if (!std::isfinite(seconds))
        return end_;
    return std::clamp(seconds, std::min(duration_, start_ + effectiveMinimum()), duration_);
}

bool TrimRange::setStart(double seconds) {
    const double next = clampStart(seconds);
    if (next == start_)
        return false;
    start_ = next;
    return true;
}

bool TrimRange::setEnd(double seconds) {
    const double next = clampEnd(seconds);
    if (next == end_)
        return false;
    end_ = next;
    return true;
}

void TrimRange::enforce() {
    // The end gives way first, then the start, so a shrinking movie keeps as
    // much of the chosen beginning as it can.
    const double minimum = effectiveMinimum();
    end_ = std::clamp(end_, 0.0, duration_);
    start_ = std::clamp(start_, 0.0, duration_);
    if (end_ - start_ < minimum) {
        end_ = std::min(duration_, start_ + minimum);
        start_ = std::max(0.0, end_ - minimum);
    }
}

} // namespace platform
