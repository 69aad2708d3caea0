#pragma once

#include "ClipMuxer.h"
#include "ExportRules.h"

namespace platform {

// Encodes one source video track into the clip as H.264 (4:2:0, the sizes
// rounded down to even ones), from the frame shown at the clip's start to
// the end of the range. Internal to the media adapter; one thread.
class VideoTranscoder {
  public:
    // Opens the decoder and the encoder and adds the clip's track to `muxer`.
    // Null, with `error`, when either cannot be opened.
    static std::unique_ptr<VideoTranscoder>
    create(AVStream* source, ClipMuxer& muxer, const EncodingSettings& settings, ErrorPtr* error);
    ~VideoTranscoder();

    // The frames shown from `start` (the clip's 0) up to `end`, in the
    // source's time base.
    void setRange(std::int64_t start, std::int64_t end);
    AVStream* source() const { return source_; }
    AVStream* output() const { return output_; }

    // Decodes the packet (blank after) and encodes the frames in the range.
    ErrorPtr take(AVPacket* packet);
    bool done() const { return done_; }
    // Drains the decoder and the encoder.
    ErrorPtr finish();

  private:
    VideoTranscoder(AVStream* source, ClipMuxer& muxer) : source_(source), muxer_(muxer) {}
    ErrorPtr receiveFrames();
    ErrorPtr encode(AVFrame* frame);

    AVStream* source_;
    AVStream* output_ = nullptr;
    ClipMuxer& muxer_;
    ffmpeg::CodecPtr decoder_, encoder_;
    ffmpeg::SwsPtr sws_;
    ffmpeg::FramePtr decoded_ = ffmpeg::makeFrame();
    ffmpeg::FramePtr converted_;
    std::int64_t start_ = 0, end_ = 0;
    std::int64_t lastPts_ = AV_NOPTS_VALUE;
    bool done_ = false;
};

} // namespace platform
