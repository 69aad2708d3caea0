#include "StreamTime.h"

#include <cmath>
#include <limits>

extern "C" {
#include <libavutil/avutil.h>
#include <libavutil/mathematics.h>
}

namespace platform::StreamTime {

std::int32_t timescaleOf(AVRational timeBase) {
    return timeBase.num > 0 && timeBase.den > 0 ? timeBase.den : 1;
}

MediaTime toMediaTime(std::int64_t timestamp, AVRational timeBase) {
    if (timestamp == AV_NOPTS_VALUE || timeBase.num <= 0 || timeBase.den <= 0)
        return MediaTime::invalid();
    // Exact: a base of num/den seconds is `num` ticks of 1/den.
    return MediaTime::make(timestamp * timeBase.num, timeBase.den);
}

std::int64_t fromMediaTime(const MediaTime& time, AVRational timeBase) {
    if (!time.isNumeric() || timeBase.num <= 0 || timeBase.den <= 0)
        return AV_NOPTS_VALUE;
    return av_rescale_q(time.value, AVRational{1, time.timescale}, timeBase);
}

std::int64_t rescale(std::int64_t timestamp, AVRational from, AVRational to) {
    if (timestamp == AV_NOPTS_VALUE)
        return AV_NOPTS_VALUE;
    return av_rescale_q(timestamp, from, to);
}

double seconds(std::int64_t timestamp, AVRational timeBase) {
    if (timestamp == AV_NOPTS_VALUE)
        return std::numeric_limits<double>::quiet_NaN();
    return timestamp * av_q2d(timeBase);
}

} // namespace platform::StreamTime
