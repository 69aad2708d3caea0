#pragma once

#include "ClipMuxer.h"
#include "ExportRules.h"
#include "platform/media/MediaTime.h"

#include <vector>

namespace platform {

// Encodes one or more source audio tracks into one AAC track of the clip:
// each at its volume, several summed into one (a desktop and a microphone
// heard together), from the clip's start to the end of the range. A track
// that starts late, pauses or ends early is silent there. Internal to the
// media adapter; one thread.
class AudioTranscoder {
  public:
    struct Input {
        AVStream* stream = nullptr;
        float volume = 1.0f;
    };

    // Opens a decoder per input and the encoder (the sample rate of the
    // first input, the channel layout of the widest) and adds the clip's
    // track to `muxer`. Null, with `error`, when one cannot be opened.
    static std::unique_ptr<AudioTranscoder> create(const std::vector<Input>& inputs,
                                                   ClipMuxer& muxer,
                                                   const EncodingSettings& settings,
                                                   ErrorPtr* error);
    ~AudioTranscoder();

    // The clip's start (its 0) and the end of the range.
    void setRange(const MediaTime& start, const MediaTime& end);
    AVStream* output() const { return output_; }
    // True when `streamIndex` is one of the inputs.
    bool reads(int streamIndex) const;

    // Decodes the packet of an input (blank after) and encodes what every
    // input has reached.
    ErrorPtr take(AVPacket* packet);
    bool done() const;
    // Drains the decoders; the inputs that ended early are silent to the end.
    ErrorPtr finish();

  private:
    struct Source;
    explicit AudioTranscoder(ClipMuxer& muxer);
    ErrorPtr place(Source& source, AVFrame* frame);
    ErrorPtr mix(bool draining);
    ErrorPtr encode(AVFrame* frame);

    ClipMuxer& muxer_;
    AVStream* output_ = nullptr;
    ffmpeg::CodecPtr encoder_;
    std::vector<std::unique_ptr<Source>> sources_;
    std::int64_t total_ = 0;   // samples of the clip
    std::int64_t emitted_ = 0; // samples encoded so far
    MediaTime start_;
};

} // namespace platform
