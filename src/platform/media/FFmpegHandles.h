#pragma once

// Owners of FFmpeg's contexts, so that no early return leaks one. For the
// media adapter and the test-media generator, nothing else.

#include <memory>

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
#include <libavutil/frame.h>
#include <libswresample/swresample.h>
#include <libswscale/swscale.h>
}

#include <QString>

namespace platform::ffmpeg {

struct InputCloser {
    void operator()(AVFormatContext* c) const { avformat_close_input(&c); }
};
struct OutputCloser {
    void operator()(AVFormatContext* c) const {
        if (c->pb && !(c->oformat->flags & AVFMT_NOFILE))
            avio_closep(&c->pb);
        avformat_free_context(c);
    }
};
struct CodecCloser {
    void operator()(AVCodecContext* c) const { avcodec_free_context(&c); }
};
struct FrameFreer {
    void operator()(AVFrame* f) const { av_frame_free(&f); }
};
struct PacketFreer {
    void operator()(AVPacket* p) const { av_packet_free(&p); }
};
struct SwsFreer {
    void operator()(SwsContext* s) const { sws_freeContext(s); }
};
struct SwrFreer {
    void operator()(SwrContext* s) const { swr_free(&s); }
};

using InputPtr = std::unique_ptr<AVFormatContext, InputCloser>;
using OutputPtr = std::unique_ptr<AVFormatContext, OutputCloser>;
using CodecPtr = std::unique_ptr<AVCodecContext, CodecCloser>;
using FramePtr = std::unique_ptr<AVFrame, FrameFreer>;
using PacketPtr = std::unique_ptr<AVPacket, PacketFreer>;
using SwsPtr = std::unique_ptr<SwsContext, SwsFreer>;
using SwrPtr = std::unique_ptr<SwrContext, SwrFreer>;

inline FramePtr makeFrame() {
    return FramePtr(av_frame_alloc());
}
inline PacketPtr makePacket() {
    return PacketPtr(av_packet_alloc());
}

// The AVERROR code of a path that is not a regular file.
inline constexpr int kNotARegularFile = FFERRTAG('N', 'R', 'E', 'G');

// FFmpeg's text for an AVERROR code (ours too).
QString errorText(int averror);

// Opens `hostPath` for reading and reads its headers (and, when the container
// leaves codec parameters out, probes the streams), and settles the streams'
// lengths where the headers leave them out (see SourceEnds.h). A path that is
// not a regular file (a pipe, a device, a socket, a folder) is refused before
// anything reads it, with kNotARegularFile. Quiets FFmpeg's own logging to
// errors the first time it runs. Returns null and sets `averror` on failure.
InputPtr openInput(const QString& hostPath, int* averror);
// The same without settling the lengths.
InputPtr openInputAsIs(const QString& hostPath, int* averror);

// A decoder for `stream`, opened, with `threads` threads (0: FFmpeg's
// choice). Null when the codec is unknown or will not open.
CodecPtr openDecoder(const AVStream* stream, int threads, int* averror);

} // namespace platform::ffmpeg
