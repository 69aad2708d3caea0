#include "VideoTranscoder.h"

#include <algorithm>

extern "C" {
#include <libavutil/opt.h>
}

namespace platform {

VideoTranscoder::~VideoTranscoder() = default;

std::unique_ptr<VideoTranscoder> VideoTranscoder::create(AVStream* source, ClipMuxer& muxer,
                                                         const EncodingSettings& settings,
                                                         ErrorPtr* error) {
    std::unique_ptr<VideoTranscoder> t(new VideoTranscoder(source, muxer));
    int err = 0;
    t->decoder_ = ffmpeg::openDecoder(source, 0, &err);
    if (!t->decoder_) {
        setError(error, ffmpeg::failure(err, QStringLiteral("cannot decode the video")));
        return {};
    }
    const AVCodec* codec = avcodec_find_encoder_by_name("libx264");
    if (!codec) {
        setError(error,
                 ffmpeg::failure(AVERROR_ENCODER_NOT_FOUND, QStringLiteral("no H.264 encoder")));
        return {};
    }
    t->encoder_.reset(avcodec_alloc_context3(codec));
    AVCodecContext* c = t->encoder_.get();
    const AVCodecParameters* p = source->codecpar;
    // 4:2:0 needs even sizes: a window recorded at an odd size loses its
    // last column or row, which no one sees, rather than gaining a smeared
    // one.
    c->width = p->width & ~1;
    c->height = p->height & ~1;
    c->sample_aspect_ratio = p->sample_aspect_ratio;
    c->pix_fmt = AV_PIX_FMT_YUV420P;
    c->time_base = source->time_base;
    c->framerate = source->avg_frame_rate;
    c->color_primaries = p->color_primaries;
    c->color_trc = p->color_trc;
    c->colorspace = p->color_space;
    c->color_range = p->color_range;
    c->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
    av_opt_set(c->priv_data, "preset", settings.x264Preset, 0);
    av_opt_set_double(c->priv_data, "crf", settings.crf, 0);
    if (c->width < 2 || c->height < 2 || (err = avcodec_open2(c, codec, nullptr)) < 0) {
        setError(error, ffmpeg::failure(err < 0 ? err : AVERROR(EINVAL),
                                        QStringLiteral("cannot open the H.264 encoder")));
        return {};
    }
    AVStream* out = muxer.addStream();
    if (!out || avcodec_parameters_from_context(out->codecpar, c) < 0) {
        setError(error,
                 ffmpeg::failure(AVERROR(ENOMEM), QStringLiteral("cannot make the video track")));
        return {};
    }
    out->time_base = c->time_base;
    out->avg_frame_rate = source->avg_frame_rate;
    size_t size = 0;
    if (const std::uint8_t* m = av_stream_get_side_data(source, AV_PKT_DATA_DISPLAYMATRIX, &size)) {
        std::uint8_t* copy = av_stream_new_side_data(out, AV_PKT_DATA_DISPLAYMATRIX, size);
        if (!copy) {
            setError(error, ffmpeg::failure(AVERROR(ENOMEM),
                                            QStringLiteral("cannot make the video track")));
            return {};
        }
        std::copy(m, m + size, copy);
    }
    t->output_ = out;
    return t;
}

void VideoTranscoder::setRange(std::int64_t start, std::int64_t end) {
    start_ = start;
    end_ = end;
}

ErrorPtr VideoTranscoder::take(AVPacket* packet) {
    if (done_) {
        av_packet_unref(packet);
        return nullptr;
    }
    const int err = avcodec_send_packet(decoder_.get(), packet);
    av_packet_unref(packet);
    // A damaged packet costs its frame, not the clip.
    if (err < 0 && err != AVERROR(EAGAIN) && err != AVERROR_INVALIDDATA)
        return ffmpeg::failure(err, QStringLiteral("cannot decode the source"));
    return receiveFrames();
}

ErrorPtr VideoTranscoder::receiveFrames() {
    int err = 0;
    while (!done_ && (err = avcodec_receive_frame(decoder_.get(), decoded_.get())) >= 0) {
        AVFrame* frame = decoded_.get();
        const std::int64_t pts = frame->best_effort_timestamp;
        if (pts == AV_NOPTS_VALUE || pts < start_) {
            av_frame_unref(frame);
            continue;
        }
        if (pts >= end_) {
            done_ = true;
            av_frame_unref(frame);
            break;
        }
        AVCodecContext* c = encoder_.get();
        AVFrame* input = frame;
        if (frame->format != c->pix_fmt) {
            // Only the even part of the picture is read.
            sws_.reset(sws_getCachedContext(sws_.release(), c->width, c->height,
                                            AVPixelFormat(frame->format), c->width, c->height,
                                            c->pix_fmt, SWS_BICUBIC, nullptr, nullptr, nullptr));
            if (!converted_) {
                converted_ = ffmpeg::makeFrame();
                converted_->format = c->pix_fmt;
                converted_->width = c->width;
                converted_->height = c->height;
                if (av_frame_get_buffer(converted_.get(), 0) < 0)
                    return ffmpeg::failure(AVERROR(ENOMEM),
                                           QStringLiteral("cannot convert a frame"));
            }
            if (!sws_ || av_frame_make_writable(converted_.get()) < 0)
                return ffmpeg::failure(AVERROR(ENOMEM), QStringLiteral("cannot convert a frame"));
            sws_scale(sws_.get(), frame->data, frame->linesize, 0, c->height, converted_->data,
                      converted_->linesize);
            input = converted_.get();
        } else {
            frame->width = c->width;
            frame->height = c->height;
        }
        // The encoder needs rising times; a source rounded to milliseconds
        // may repeat one.
        std::int64_t out = pts - start_;
        if (lastPts_ != AV_NOPTS_VALUE && out <= lastPts_)
            out = lastPts_ + 1;
        lastPts_ = out;
        input->pts = out;
        input->pict_type = AV_PICTURE_TYPE_NONE;
        ErrorPtr e = encode(input);
        av_frame_unref(frame);
        if (e)
            return e;
    }
    if (err < 0 && err != AVERROR(EAGAIN) && err != AVERROR_EOF)
        return ffmpeg::failure(err, QStringLiteral("cannot decode the source"));
    return nullptr;
}

ErrorPtr VideoTranscoder::encode(AVFrame* frame) {
    int err = avcodec_send_frame(encoder_.get(), frame);
    if (err < 0)
        return ffmpeg::failure(err, QStringLiteral("cannot encode"));
    ffmpeg::PacketPtr packet = ffmpeg::makePacket();
    while ((err = avcodec_receive_packet(encoder_.get(), packet.get())) >= 0)
        if ((err = muxer_.write(packet.get(), output_, encoder_->time_base)) < 0)
            return ffmpeg::failure(err, QStringLiteral("cannot write a sample"));
    if (err != AVERROR(EAGAIN) && err != AVERROR_EOF)
        return ffmpeg::failure(err, QStringLiteral("cannot encode"));
    return nullptr;
}

ErrorPtr VideoTranscoder::finish() {
    if (!done_) {
        avcodec_send_packet(decoder_.get(), nullptr);
        if (ErrorPtr e = receiveFrames())
            return e;
    }
    return encode(nullptr);
}

} // namespace platform
