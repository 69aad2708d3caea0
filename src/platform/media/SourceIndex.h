#pragma once

#include "CutPlanner.h"
#include "FFmpegHandles.h"

#include <QString>

#include <cstdint>
#include <vector>

namespace platform {

// One sample of a source track, where the whole sample table is known.
struct IndexedSample {
    std::int64_t dts = 0; // in the stream's time base, as the demuxer reports it
    std::int64_t pts = 0;
    std::int64_t pos = 0; // of the payload, in the file
    std::int64_t size = 0;
    std::int64_t duration = 0;
    bool key = false;
};

struct IndexedTrack {
    AVStream* stream = nullptr;
    // What a cut is planned from: the sync samples (with presentation times
    // as the demuxer reports them), the track's end and its audio priming.
    CutPlanner::TrackInfo info;
    // Every sample with its place in the file, in decode order, when the
    // container lists them (MP4); empty otherwise (Matroska lists keyframes
    // only, and not always).
    std::vector<IndexedSample> samples;
    // Some sample is shown out of decode order.
    bool reordered = false;
};

// The index-and-priming scan of a source that every export path plans from:
// the demuxer's index for MP4 and Matroska, the fragments themselves for a
// fragmented MP4. Internal to the media adapter.
class SourceIndex {
  public:
    // Scans `input`, opened with ffmpeg::openInput on `hostPath`. Reads the
    // first packets of the input to learn what the index leaves out, so the
    // caller seeks before reading. Only video and audio streams (not cover
    // art) get tracks.
    static SourceIndex scan(AVFormatContext* input, const QString& hostPath);

    // Null for a stream that is not indexed (not video or audio).
    const IndexedTrack* track(int streamIndex) const;
    IndexedTrack* track(int streamIndex);

    // The source is a fragmented MP4.
    bool fragmented() const { return fragmented_; }
    // Where the completely written data ends; packets beyond are not read.
    std::int64_t completeBytes() const { return completeBytes_; }

  private:
    std::vector<IndexedTrack> tracks_; // by stream index; stream null when not indexed
    bool fragmented_ = false;
    std::int64_t completeBytes_ = INT64_MAX;
};

} // namespace platform
