#pragma once

#include "platform/media/MediaTime.h"

#include <cstdint>

extern "C" {
#include <libavutil/avutil.h>
#include <libavutil/rational.h>
}

// The one place where rational media time and FFmpeg's stream time bases meet.
// Internal to the media adapter; everything else speaks MediaTime or stays in
// one time base.
namespace platform::StreamTime {

// A stream timestamp as a media time at the time base's denominator, exactly.
// Invalid for AV_NOPTS_VALUE.
MediaTime toMediaTime(std::int64_t timestamp, AVRational timeBase);

// A media time in a stream's time base, rounded to the nearest tick;
// AV_NOPTS_VALUE when the time is not numeric.
std::int64_t fromMediaTime(const MediaTime& time, AVRational timeBase);

// A timestamp from one time base in another, rounded to nearest.
std::int64_t rescale(std::int64_t timestamp, AVRational from, AVRational to);

// Seconds of a timestamp (NaN for AV_NOPTS_VALUE), for logs and decisions
// that only compare.
double seconds(std::int64_t timestamp, AVRational timeBase);

// The timescale a stream's time base maps to: its denominator (1 for a
// broken base).
std::int32_t timescaleOf(AVRational timeBase);

} // namespace platform::StreamTime
