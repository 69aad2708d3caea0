#pragma once

#include <QString>

#include <cstdint>
#include <optional>
#include <vector>

// The sample table of a fragmented MP4 (an empty or partial movie box, then
// movie fragments), read from the fragments themselves: their track run
// boxes hold each sample's size, duration, flags and composition offset.
// FFmpeg reads fragments lazily where a segment index exists and does not
// expose the composition offsets, so planning a cut needs this. Internal to
// the media adapter; one thread at a time.
namespace platform {

struct FragmentSample {
    std::int64_t dts = 0; // in the track's timescale, from its first sample's 0
    std::int64_t pts = 0; // dts + the composition offset
    std::int64_t pos = 0; // of the payload, in the file
    std::int64_t size = 0;
    std::int64_t duration = 0;
    bool key = false;
};

struct FragmentTrack {
    int trackId = 0;
    std::int32_t timescale = 0;
    bool reordered = false; // some sample has a composition offset other than the first's
    std::vector<FragmentSample> samples; // in decode order
};

struct FragmentIndex {
    std::vector<FragmentTrack> tracks; // in the movie box's order
    // Where the completely written fragments end: a recording cut short has
    // a fragment whose samples run past the end of the file, and that one
    // and everything after it are left out.
    std::int64_t completeBytes = 0;
    std::int64_t fileSize = 0;

    // Null when the file is not a fragmented MP4 (no movie extends box) or
    // cannot be read.
    static std::optional<FragmentIndex> read(const QString& hostPath);

    const FragmentTrack* track(int trackId) const;
};

} // namespace platform
