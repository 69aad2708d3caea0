#pragma once

#include "FFmpegError.h"
#include "FFmpegHandles.h"
#include "platform/runtime/Error.h"

#include <QString>

#include <cstdint>
#include <vector>

namespace platform {

// The MP4 being written by an export: its tracks, and every packet on its way
// in, with decode times that rise in each track whatever the source did.
// Internal to the media adapter; one thread.
class ClipMuxer {
  public:
    // An MP4 to be written at `hostPath`. Null (with `error`) when FFmpeg
    // cannot make one.
    static std::unique_ptr<ClipMuxer> create(const QString& hostPath, ErrorPtr* error);

    // A new track; the caller fills its codec parameters and time base before
    // begin(). Null when out of memory.
    AVStream* addStream();
    // Opens the file and writes the header; the muxer may change the tracks'
    // time bases.
    ErrorPtr begin();
    // Writes `packet`, whose times are in `timeBase`, to `stream`. The muxer
    // takes the payload: the packet is blank after. An FFmpeg error code or 0.
    int write(AVPacket* packet, AVStream* stream, AVRational timeBase);
    // Writes the trailer and closes the file.
    ErrorPtr finish();

    AVFormatContext* context() const { return output_.get(); }

  private:
    ClipMuxer() = default;

    QByteArray path_;
    ffmpeg::OutputPtr output_;
    std::vector<std::int64_t> lastDts_;
};

} // namespace platform
