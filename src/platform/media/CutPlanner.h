#pragma once

#include <cstdint>
#include <vector>

// Which samples of a track a stream-copy cut takes, and how the clip's edit
// list hides what lies outside the requested range. Pure functions on
// timestamps in the track's own time base; the remuxer only carries the plan
// out.
namespace platform::CutPlanner {

enum class TrackKind { Video, Audio };

// A sample that decoding may start at: for video a keyframe, for audio any
// frame. In decode order.
struct SyncSample {
    std::int64_t dts = 0;
    std::int64_t pts = 0;
};

struct TrackInfo {
    TrackKind kind = TrackKind::Video;
    std::vector<SyncSample> syncSamples;
    std::int64_t end = 0; // presentation end of the track
    // Audio: how much must be decoded before the first audible sample (the
    // encoder's priming, e.g. 1024 samples of AAC), so the first heard sample
    // decodes as it did in the source.
    std::int64_t preroll = 0;
};

struct TrackCut {
    bool empty = true;         // nothing of the track lies in the range
    std::int64_t firstDts = 0; // copying starts at the sample with this dts
    std::int64_t firstPts = 0; // ... whose presentation time is this
    // Copying stops at the first sample (in decode order) whose decode time
    // (video) or presentation time (audio) reaches this. Video goes by decode
    // time so that every frame shown before the end has its references.
    std::int64_t stopAt = 0;
    // Subtracted from every copied timestamp: the requested start becomes 0,
    // and the samples before it get negative times that the edit list hides.
    std::int64_t offset = 0;
    std::int64_t hiddenLead = 0;   // requested start - firstPts
    std::int64_t editDuration = 0; // what plays: the range clipped to the track
};

// The cut of one track for the requested [start, end). A start before the
// track's first sync sample starts at that sample; an end past the track is
// clipped to it. Without sync samples (an index that leaves the track out),
// reading starts at the start itself for video (the reader finds the
// keyframe), one frame before the priming for audio.
TrackCut planTrack(const TrackInfo& track, std::int64_t start, std::int64_t end);

// The same cut made to start at `newStart`: the presentation time of the
// frame shown at the requested start (at or before it; or, when the video
// begins after it, the first frame's), so that every player begins with that
// frame, whatever it does with a frame that straddles the edit's start. The
// end stays where it was; a start at or past it leaves nothing.
TrackCut startingAt(const TrackCut& cut, std::int64_t newStart);

// The sync sample to start from for `target`: the last whose presentation
// time is at or before it, or the first when none is. -1 for an empty list.
int syncSampleAtOrBefore(const std::vector<SyncSample>& samples, std::int64_t target);

} // namespace platform::CutPlanner
