#pragma once

#include "AudioTranscoder.h"
#include "ClipMuxer.h"
#include "CutPlanner.h"
#include "ExportJob.h"
#include "SourceIndex.h"
#include "TrackCopier.h"
#include "VideoTranscoder.h"

#include <map>
#include <optional>
#include <vector>

namespace platform {

// Writes the clip of an export by reading the source once: the streams that
// the job's rule lets it copy are copied (TrackCopier), the others decoded
// and encoded (VideoTranscoder, AudioTranscoder, which also mixes the audio
// tracks that the audio mix names together). Every track starts at the frame
// shown at the requested start, found while reading (so an index that
// leaves keyframes or tracks out does no harm); copied video is cut at the
// keyframe before it and the edit list hides the lead. Internal to the media
// adapter; one run, on one thread.
class ClipWriter {
  public:
    explicit ClipWriter(const ExportJob& job) : job_(job) {}
    // Null on success.
    ErrorPtr run();

  private:
    // What becomes of one source stream.
    struct Route {
        TrackCopier* copier = nullptr;
        VideoTranscoder* video = nullptr;
        AudioTranscoder* audio = nullptr;
        CutPlanner::TrackCut cut;
        bool isVideo = false;

        bool any() const { return copier || video || audio; }
    };

    ErrorPtr open();
    ErrorPtr chooseRoutes();
    ErrorPtr makeTracks();
    ErrorPtr seek();
    ErrorPtr copyRange();
    // Before the clip's start is settled: keeps the packet waiting, or
    // settles (then `settledNow` says the packet is still to be dispatched).
    ErrorPtr takeBeforeStart(ffmpeg::PacketPtr& packet, bool* settledNow);
    ErrorPtr settle();
    ErrorPtr dispatch(AVPacket* packet);
    bool allDone() const;
    ErrorPtr finish();

    const ExportJob& job_;
    ffmpeg::InputPtr input_;
    std::optional<SourceIndex> index_;
    MediaTime rangeStart_, rangeEnd_; // on the source's timeline
    std::map<int, float> named_;      // streams the audio mix names, with their volumes
    std::vector<AudioTranscoder::Input> mixed_;
    std::vector<Route> routes_; // by stream index
    std::unique_ptr<ClipMuxer> muxer_;
    std::vector<std::unique_ptr<TrackCopier>> copiers_;
    std::vector<std::unique_ptr<VideoTranscoder>> videoCoders_;
    std::vector<std::unique_ptr<AudioTranscoder>> audioCoders_;
    std::vector<std::pair<AVStream*, int>> outputs_; // clip track, its first source stream
    int lead_ = -1; // the first video stream: its picture at the start starts the clip
    std::int64_t leadStart_ = 0;
    // Until the lead has shown the frame at the requested start, packets
    // wait here, from the last keyframe at or before the start.
    std::vector<ffmpeg::PacketPtr> waiting_;
    bool settled_ = false;
    bool leadStarted_ = false;
    std::int64_t shownAtStart_ = AV_NOPTS_VALUE;
};

} // namespace platform
