#include "VideoFrameReader.h"

#include "Asset.h"
#include "FFmpegError.h"
#include "FFmpegHandles.h"
#include "StreamTime.h"

#include <algorithm>
#include <cmath>

namespace platform {

struct VideoFrameReader::State {
    ffmpeg::InputPtr input;
    ffmpeg::CodecPtr decoder;
    ffmpeg::SwsPtr sws;
    ffmpeg::PacketPtr packet = ffmpeg::makePacket();
    ffmpeg::FramePtr frame = ffmpeg::makeFrame();
    ffmpeg::FramePtr held = ffmpeg::makeFrame();
    AVStream* stream = nullptr;
    std::int64_t firstKeyframeTimestamp = AV_NOPTS_VALUE;
    // Where the movie's time 0 lies on the stream's timeline.
    MediaTime movieStart = MediaTime::zero();
};

namespace {

using ffmpeg::failure;

QSize fitted(int w, int h, const QSize& box) {
    double scale = 1.0;
    if (box.width() > 0)
        scale = std::min(scale, double(box.width()) / w);
    if (box.height() > 0)
        scale = std::min(scale, double(box.height()) / h);
    return {std::max(1, int(std::lround(w * scale))), std::max(1, int(std::lround(h * scale)))};
}

int colorspaceOf(const AVFrame* f) {
    switch (f->colorspace) {
    case AVCOL_SPC_BT709:
        return SWS_CS_ITU709;
    case AVCOL_SPC_BT2020_NCL:
    case AVCOL_SPC_BT2020_CL:
        return SWS_CS_BT2020;
    default:
        return SWS_CS_DEFAULT;
    }
}

} // namespace

VideoFrameReader::VideoFrameReader(std::unique_ptr<State> state) : d(std::move(state)) {}
VideoFrameReader::~VideoFrameReader() = default;

std::unique_ptr<VideoFrameReader> VideoFrameReader::open(const QString& hostPath, ErrorPtr* error) {
    auto state = std::make_unique<State>();
    int err = 0;
    state->input = ffmpeg::openInput(hostPath, &err);
    if (!state->input) {
        setError(error, failure(err, QStringLiteral("cannot open the movie")));
        return {};
    }
    const int index =
        av_find_best_stream(state->input.get(), AVMEDIA_TYPE_VIDEO, -1, -1, nullptr, 0);
    if (index < 0) {
        setError(error, failure(index, QStringLiteral("no video track")));
        return {};
    }
    // Only the video stream's samples are read; the demuxer skips the rest.
    for (unsigned i = 0; i < state->input->nb_streams; ++i)
        state->input->streams[i]->discard = int(i) == index ? AVDISCARD_DEFAULT : AVDISCARD_ALL;
    state->stream = state->input->streams[index];
    if (state->input->start_time != AV_NOPTS_VALUE)
        state->movieStart = StreamTime::toMediaTime(state->input->start_time, AV_TIME_BASE_Q);
    // One thread: a single frame comes out right after its packet, where
    // frame threads would hold it back until they all have work.
    state->decoder = ffmpeg::openDecoder(state->stream, 1, &err);
    if (!state->decoder) {
        setError(error, failure(err, QStringLiteral("cannot decode the video track")));
        return {};
    }
    const int entries = avformat_index_get_entries_count(state->stream);
    for (int i = 0; i < entries; ++i) {
        const AVIndexEntry* e = avformat_index_get_entry(state->stream, i);
        if (e && (e->flags & AVINDEX_KEYFRAME)) {
            state->firstKeyframeTimestamp = e->timestamp;
            break;
        }
    }
    return std::unique_ptr<VideoFrameReader>(new VideoFrameReader(std::move(state)));
}

VideoFrameReader::Frame VideoFrameReader::frameAt(const MediaTime& time, bool exact,
                                                  const QSize& box, ErrorPtr* error) {
    AVFormatContext* input = d->input.get();
    AVStream* stream = d->stream;
    AVCodecContext* decoder = d->decoder.get();
    const std::int64_t target = StreamTime::fromMediaTime(time + d->movieStart, stream->time_base);
    if (target == AV_NOPTS_VALUE) {
        setError(error, makeError(AVERROR(EINVAL), mediaErrorDomain(),
                                  QStringLiteral("not a time: %1").arg(time.description())));
        return {};
    }

    std::int64_t seekTo = target;
    bool haveFrame = false;
    std::int64_t heldPts = AV_NOPTS_VALUE;
    int lastError = AVERROR_INVALIDDATA;
    // The index is ordered by decoding time, which runs ahead of presentation
    // when frames are reordered; when the keyframe found shows after the
    // target, look again from just before it.
    for (int attempt = 0; attempt < 4; ++attempt) {
        int err = av_seek_frame(input, stream->index, seekTo, AVSEEK_FLAG_BACKWARD);
        if (err < 0)
            err = avformat_seek_file(input, stream->index, INT64_MIN, seekTo, INT64_MAX, 0);
        if (err < 0) {
            lastError = err;
            break;
        }
        avcodec_flush_buffers(decoder);
        haveFrame = false;
        av_frame_unref(d->held.get());
        std::int64_t startDts = AV_NOPTS_VALUE;
        bool done = false, draining = false;
        while (!done) {
            if (!draining) {
                err = av_read_frame(input, d->packet.get());
                if (err < 0) {
                    draining = true;
                    avcodec_send_packet(decoder, nullptr);
                } else {
                    if (d->packet->stream_index != stream->index) {
                        av_packet_unref(d->packet.get());
                        continue;
                    }
                    if (startDts == AV_NOPTS_VALUE)
                        startDts = d->packet->dts;
                    err = avcodec_send_packet(decoder, d->packet.get());
                    av_packet_unref(d->packet.get());
                    if (err < 0 && err != AVERROR(EAGAIN))
                        lastError = err; // a damaged packet: try the next one
                }
            }
            while (!done && (err = avcodec_receive_frame(decoder, d->frame.get())) >= 0) {
                const std::int64_t pts = d->frame->best_effort_timestamp;
                const bool early = pts != AV_NOPTS_VALUE && pts <= target;
                if (!haveFrame || (exact && early)) {
                    av_frame_unref(d->held.get());
                    av_frame_move_ref(d->held.get(), d->frame.get());
                    heldPts = pts;
                    haveFrame = true;
                    done = !exact || !early;
                } else {
                    av_frame_unref(d->frame.get());
                    done = true;
                }
            }
            if (err == AVERROR_EOF || (draining && err == AVERROR(EAGAIN)))
                break;
            if (err < 0 && err != AVERROR(EAGAIN))
                lastError = err;
        }
        const bool atStart = startDts == AV_NOPTS_VALUE ||
                             d->firstKeyframeTimestamp == AV_NOPTS_VALUE ||
                             startDts <= d->firstKeyframeTimestamp;
        if (!haveFrame || heldPts == AV_NOPTS_VALUE || heldPts <= target || atStart)
            break;
        seekTo = startDts - 1;
    }
    if (!haveFrame) {
        setError(error, failure(lastError, QStringLiteral("no frame could be decoded")));
        return {};
    }

    const AVFrame* f = d->held.get();
    const QSize size = fitted(f->width, f->height, box);
    d->sws.reset(sws_getCachedContext(d->sws.release(), f->width, f->height,
                                      AVPixelFormat(f->format), size.width(), size.height(),
                                      AV_PIX_FMT_BGRA, SWS_AREA, nullptr, nullptr, nullptr));
    QImage image(size, QImage::Format_RGB32);
    if (!d->sws || image.isNull()) {
        setError(error, failure(AVERROR(ENOMEM), QStringLiteral("cannot scale the frame")));
        return {};
    }
    sws_setColorspaceDetails(d->sws.get(), sws_getCoefficients(colorspaceOf(f)),
                             f->color_range == AVCOL_RANGE_JPEG,
                             sws_getCoefficients(SWS_CS_DEFAULT), 1, 0, 1 << 16, 1 << 16);
    std::uint8_t* dst[] = {image.bits()};
    const int dstStride[] = {int(image.bytesPerLine())};
    sws_scale(d->sws.get(), f->data, f->linesize, 0, f->height, dst, dstStride);
    Frame result{image, StreamTime::toMediaTime(heldPts, stream->time_base) - d->movieStart};
    av_frame_unref(d->held.get());
    return result;
}

} // namespace platform
