#include "CutPlanner.h"

#include <algorithm>

namespace platform::CutPlanner {

int syncSampleAtOrBefore(const std::vector<SyncSample>& samples, std::int64_t target) {
    if (samples.empty())
        return -1;
    // Presentation times of sync samples rise with decode order in every
    // stream we copy (a keyframe is never shown after the next one), so a
    // binary search by pts is sound.
    const auto after =
        std::upper_bound(samples.begin(), samples.end(), target,
                         [](std::int64_t t, const SyncSample& s) { return t < s.pts; });
    if (after == samples.begin())
        return 0;
    return static_cast<int>(after - samples.begin()) - 1;
}

TrackCut planTrack(const TrackInfo& track, std::int64_t start, std::int64_t end) {
    TrackCut cut;
    start = std::max<std::int64_t>(start, 0);
    end = std::min(end, track.end);
    if (end <= start)
        return cut;
    const bool audio = track.kind == TrackKind::Audio;
    const std::int64_t decodeFrom = audio ? start - track.preroll : start;
    SyncSample sync{decodeFrom, decodeFrom};
    if (!track.syncSamples.empty()) {
        sync = track.syncSamples[syncSampleAtOrBefore(track.syncSamples, decodeFrom)];
    } else if (audio) {
        // Every audio frame is a sync sample, but where they lie is unknown
        // (Matroska cues often list the video alone): from one frame earlier
        // the frame that holds the priming is surely among those read.
        sync = {decodeFrom - track.preroll, decodeFrom - track.preroll};
    }
    cut.empty = false;
    cut.firstDts = sync.dts;
    cut.firstPts = sync.pts;
    cut.stopAt = end;
    cut.offset = start;
    cut.hiddenLead = std::max<std::int64_t>(0, start - sync.pts);
    cut.editDuration = end - start;
    return cut;
}

TrackCut startingAt(const TrackCut& cut, std::int64_t newStart) {
    if (cut.empty || newStart == cut.offset)
        return cut;
    TrackCut moved = cut;
    const std::int64_t end = cut.offset + cut.editDuration;
    if (newStart >= end)
        return TrackCut{};
    moved.offset = newStart;
    moved.hiddenLead = std::max<std::int64_t>(0, newStart - cut.firstPts);
    moved.editDuration = end - newStart;
    return moved;
}

} // namespace platform::CutPlanner
