#include "DecodeTimes.h"

#include <algorithm>

namespace platform::DecodeTimes {

void fillRun(std::vector<Stamp>& run, std::int64_t next, std::int64_t previous) {
    if (run.empty())
        return;
    auto step = [](const Stamp& s) { return s.duration > 0 ? s.duration : 1; };
    if (next != kNone) {
        std::int64_t at = next;
        for (auto it = run.rbegin(); it != run.rend(); ++it) {
            at -= step(*it);
            if (it->pts != kNone)
                at = std::min(at, it->pts);
            it->dts = at;
        }
        return;
    }
    std::int64_t at = previous;
    for (Stamp& s : run) {
        if (at == kNone)
            at = s.pts != kNone ? s.pts : 0;
        else
            at += step(s);
        s.dts = at;
    }
}

std::int64_t keepRising(Stamp& stamp, std::int64_t previous) {
    if (stamp.dts == kNone)
        stamp.dts = previous == kNone ? (stamp.pts == kNone ? 0 : stamp.pts) : previous + 1;
    if (previous != kNone && stamp.dts <= previous)
        stamp.dts = previous + 1;
    if (stamp.pts != kNone && stamp.pts < stamp.dts)
        stamp.pts = stamp.dts;
    return stamp.dts;
}

} // namespace platform::DecodeTimes
