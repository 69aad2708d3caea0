#pragma once

#include <cstdint>
#include <vector>

// Decode times for copied samples, in one time base. Containers that store
// only presentation times (Matroska) leave the demuxer to guess decode times,
// and it has none for the first reordered frames after a seek; a muxer
// refuses decode times that do not rise. Pure functions; internal to the
// media adapter.
namespace platform::DecodeTimes {

constexpr std::int64_t kNone = INT64_MIN; // no time (FFmpeg's AV_NOPTS_VALUE)

struct Stamp {
    std::int64_t dts = kNone;
    std::int64_t pts = kNone;
    std::int64_t duration = 0;
};

// Gives the samples of `run` (consecutive, in decode order, none with a
// decode time) decode times before `next`, the decode time of the sample
// that follows them, spaced by their durations (one tick when unknown) and
// never after a sample's own presentation time. With no `next` (the track
// ended) they follow `previous`, the last decode time given out, instead.
void fillRun(std::vector<Stamp>& run, std::int64_t next, std::int64_t previous);

// Makes one sample's times acceptable after `previous` (the decode time of
// the sample before it, or kNone): its decode time rises by at least one
// tick and its presentation time is not before it. Returns the decode time.
std::int64_t keepRising(Stamp& stamp, std::int64_t previous);

} // namespace platform::DecodeTimes
