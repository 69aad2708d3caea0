#pragma once

#include "ClipMuxer.h"
#include "CutPlanner.h"
#include "DecodeTimes.h"

#include <vector>

namespace platform {

// Copies the samples of one source track into the clip, untouched: shifted
// so that the clip's start is 0 (what lies before it gets negative times,
// which the muxer hides with an edit list), the last one trimmed to the end
// of the range. Internal to the media adapter; one thread.
class TrackCopier {
  public:
    // Adds the clip's track for `source` to `muxer`. Null when out of memory.
    static std::unique_ptr<TrackCopier> create(AVStream* source, ClipMuxer& muxer);

    void setCut(const CutPlanner::TrackCut& cut) { cut_ = cut; }
    const CutPlanner::TrackCut& cut() const { return cut_; }
    AVStream* source() const { return source_; }
    AVStream* output() const { return output_; }

    // Takes the next packet of the track, in decode order, once the clip's
    // start is settled; a packet that reaches the end of the cut (by decode
    // time for video, so every frame shown before the end has its
    // references; by presentation time for audio) ends the track. The packet
    // is blank after. An FFmpeg error code or 0.
    int take(AVPacket* packet);
    bool done() const { return done_; }
    // Writes what is held back: the last sample, trimmed to the range.
    int finish();

  private:
    TrackCopier(AVStream* source, AVStream* output, ClipMuxer& muxer)
        : source_(source), output_(output), muxer_(muxer) {}

    int release(std::int64_t nextDts);
    int write(ffmpeg::PacketPtr& packet);

    AVStream* source_;
    AVStream* output_;
    ClipMuxer& muxer_;
    CutPlanner::TrackCut cut_;
    bool done_ = false;
    std::int64_t lastDts_ = DecodeTimes::kNone;
    // Packets without a decode time wait here until one with a decode time
    // comes; the last one waits so that it can be trimmed.
    std::vector<ffmpeg::PacketPtr> waiting_;
    ffmpeg::PacketPtr held_;
};

} // namespace platform
