// The highest-quality export: the range is decoded and encoded again as H.264
// (x264, medium, CRF 18) and AAC, with each audio track's volume from the
// audio mix.

#include "ExportJob.h"
#include "FFmpegError.h"
#include "FFmpegHandles.h"
#include "StreamTime.h"

#include <QFile>

#include <vector>

extern "C" {
#include <libavutil/audio_fifo.h>
#include <libavutil/opt.h>
}

namespace platform {
namespace {

using ffmpeg::failure;

struct FifoFreer {
    void operator()(AVAudioFifo* f) const { av_audio_fifo_free(f); }
};

struct Track {
    AVStream* in = nullptr;
    AVStream* out = nullptr;
    ffmpeg::CodecPtr decoder, encoder;
    bool done = false;
    // Range bounds in the input's time base (video) or in samples (audio).
    std::int64_t start = 0, end = 0;
    // Video
    ffmpeg::SwsPtr sws;
    ffmpeg::FramePtr converted;
    // Audio
    ffmpeg::SwrPtr swr;
    std::unique_ptr<AVAudioFifo, FifoFreer> fifo;
    float volume = 1.0f;
    std::int64_t samplesOut = 0;
};

class Reencoder {
  public:
    explicit Reencoder(const ExportJob& job) : job_(job) {}

    ErrorPtr run() {
        int err = 0;
        input_ = ffmpeg::openInput(job_.sourcePath, &err);
        if (!input_)
            return failure(err, QStringLiteral("cannot open the source"));
        AVFormatContext* raw = nullptr;
        const QByteArray name = QFile::encodeName(job_.outputPath);
        if ((err = avformat_alloc_output_context2(&raw, nullptr, "mp4", name.constData())) < 0)
            return failure(err, QStringLiteral("cannot make the output"));
        output_.reset(raw);
        tracks_.resize(input_->nb_streams);
        for (unsigned i = 0; i < input_->nb_streams; ++i) {
            AVStream* stream = input_->streams[i];
            const AVMediaType type = stream->codecpar->codec_type;
            stream->discard = AVDISCARD_ALL;
            if (stream->disposition & AV_DISPOSITION_ATTACHED_PIC)
                continue;
            if (type == AVMEDIA_TYPE_VIDEO && !videoOpened_) {
                if (ErrorPtr e = openVideo(tracks_[i], stream))
                    return e;
                videoOpened_ = true;
            } else if (type == AVMEDIA_TYPE_AUDIO) {
                if (ErrorPtr e = openAudio(tracks_[i], stream))
                    return e;
            } else {
                continue;
            }
            stream->discard = AVDISCARD_DEFAULT;
            ++open_;
        }
        if (open_ == 0)
            return failure(AVERROR_STREAM_NOT_FOUND, QStringLiteral("nothing to export"));
        if ((err = avio_open(&output_->pb, name.constData(), AVIO_FLAG_WRITE)) < 0)
            return failure(err, QStringLiteral("cannot write the output"));
        if ((err = avformat_write_header(output_.get(), nullptr)) < 0)
            return failure(err, QStringLiteral("cannot write the output header"));
        // A little early, so the audio decoder has the frame before the start
        // (its output overlaps the next frame's).
        const std::int64_t seekTo =
            StreamTime::fromMediaTime(job_.range.start, AV_TIME_BASE_Q) - AV_TIME_BASE / 10;
        if (av_seek_frame(input_.get(), -1, seekTo, AVSEEK_FLAG_BACKWARD) < 0)
            avformat_seek_file(input_.get(), -1, INT64_MIN, seekTo, seekTo, 0);

        ffmpeg::PacketPtr packet = ffmpeg::makePacket();
        while (open_ > 0) {
            if (job_.isCancelled())
                return makeError(kExportCancelledCode, mediaErrorDomain(),
                                 QStringLiteral("cancelled"));
            err = av_read_frame(input_.get(), packet.get());
            if (err == AVERROR_EOF)
                break;
            if (err < 0)
                return failure(err, QStringLiteral("cannot read the source"));
            Track& track = tracks_[packet->stream_index];
            if (track.decoder && !track.done) {
                err = avcodec_send_packet(track.decoder.get(), packet.get());
                av_packet_unref(packet.get());
                if (err < 0 && err != AVERROR(EAGAIN) && err != AVERROR_INVALIDDATA)
                    return failure(err, QStringLiteral("cannot decode the source"));
                if (ErrorPtr e = receiveFrames(track))
                    return e;
            } else {
                av_packet_unref(packet.get());
            }
        }
        for (Track& track : tracks_) {
            if (!track.decoder)
                continue;
            if (!track.done) {
                avcodec_send_packet(track.decoder.get(), nullptr);
                if (ErrorPtr e = receiveFrames(track))
                    return e;
            }
            if (ErrorPtr e = flush(track))
                return e;
        }
        if ((err = av_write_trailer(output_.get())) < 0)
            return failure(err, QStringLiteral("cannot finish the output"));
        output_.reset();
        return nullptr;
    }

  private:
    AVStream* newStream(const Track& track, const AVStream* from) {
        AVStream* out = avformat_new_stream(output_.get(), nullptr);
        if (!out || avcodec_parameters_from_context(out->codecpar, track.encoder.get()) < 0)
            return nullptr;
        out->time_base = track.encoder->time_base;
        size_t size = 0;
        if (const std::uint8_t* m =
                av_stream_get_side_data(from, AV_PKT_DATA_DISPLAYMATRIX, &size)) {
            std::uint8_t* copy = av_stream_new_side_data(out, AV_PKT_DATA_DISPLAYMATRIX, size);
            if (!copy)
                return nullptr;
            std::copy(m, m + size, copy);
        }
        return out;
    }

    ErrorPtr openVideo(Track& track, AVStream* stream) {
        int err = 0;
        track.in = stream;
        track.decoder = ffmpeg::openDecoder(stream, 0, &err);
        if (!track.decoder)
            return failure(err, QStringLiteral("cannot decode the video"));
        const AVCodec* codec = avcodec_find_encoder_by_name("libx264");
        if (!codec)
            return failure(AVERROR_ENCODER_NOT_FOUND, QStringLiteral("no H.264 encoder"));
        track.encoder.reset(avcodec_alloc_context3(codec));
        AVCodecContext* c = track.encoder.get();
        c->width = stream->codecpar->width;
        c->height = stream->codecpar->height;
        c->sample_aspect_ratio = stream->codecpar->sample_aspect_ratio;
        c->pix_fmt = AV_PIX_FMT_YUV420P;
        c->time_base = stream->time_base;
        c->framerate = stream->avg_frame_rate;
        c->color_primaries = stream->codecpar->color_primaries;
        c->color_trc = stream->codecpar->color_trc;
        c->colorspace = stream->codecpar->color_space;
        c->color_range = stream->codecpar->color_range;
        c->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
        av_opt_set(c->priv_data, "preset", "medium", 0);
        av_opt_set_double(c->priv_data, "crf", 18, 0);
        if ((err = avcodec_open2(c, codec, nullptr)) < 0)
            return failure(err, QStringLiteral("cannot open the H.264 encoder"));
        if (!(track.out = newStream(track, stream)))
            return failure(AVERROR(ENOMEM), QStringLiteral("cannot make the video track"));
        track.start = StreamTime::fromMediaTime(job_.range.start, stream->time_base);
        track.end = StreamTime::fromMediaTime(job_.range.end(), stream->time_base);
        return nullptr;
    }

    ErrorPtr openAudio(Track& track, AVStream* stream) {
        int err = 0;
        track.in = stream;
        track.decoder = ffmpeg::openDecoder(stream, 1, &err);
        if (!track.decoder)
            return failure(err, QStringLiteral("cannot decode the audio"));
        const AVCodec* codec = avcodec_find_encoder(AV_CODEC_ID_AAC);
        if (!codec)
            return failure(AVERROR_ENCODER_NOT_FOUND, QStringLiteral("no AAC encoder"));
        track.encoder.reset(avcodec_alloc_context3(codec));
        AVCodecContext* c = track.encoder.get();
        AVCodecContext* d = track.decoder.get();
        c->sample_fmt = AV_SAMPLE_FMT_FLTP;
        c->sample_rate = d->sample_rate;
        if (d->ch_layout.nb_channels > 0)
            av_channel_layout_copy(&c->ch_layout, &d->ch_layout);
        else
            av_channel_layout_default(&c->ch_layout, 2);
        c->bit_rate = 192000;
        c->time_base = {1, c->sample_rate};
        c->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
        if ((err = avcodec_open2(c, codec, nullptr)) < 0)
            return failure(err, QStringLiteral("cannot open the AAC encoder"));
        SwrContext* swr = nullptr;
        if ((err = swr_alloc_set_opts2(&swr, &c->ch_layout, c->sample_fmt, c->sample_rate,
                                       &d->ch_layout, d->sample_fmt, d->sample_rate, 0, nullptr)) <
                0 ||
            (err = swr_init(swr)) < 0) {
            swr_free(&swr);
            return failure(err, QStringLiteral("cannot convert the audio"));
        }
        track.swr.reset(swr);
        track.fifo.reset(av_audio_fifo_alloc(c->sample_fmt, c->ch_layout.nb_channels, 4096));
        if (!track.fifo || !(track.out = newStream(track, stream)))
            return failure(AVERROR(ENOMEM), QStringLiteral("cannot make the audio track"));
        if (job_.audioMix)
            for (const AudioMixInputParameters& p : job_.audioMix->inputParameters)
                if (p.trackID == stream->index + 1)
                    track.volume = p.volume;
        const AVRational samples{1, c->sample_rate};
        track.start = StreamTime::fromMediaTime(job_.range.start, samples);
        track.end = StreamTime::fromMediaTime(job_.range.end(), samples);
        return nullptr;
    }

    ErrorPtr receiveFrames(Track& track) {
        ffmpeg::FramePtr frame = ffmpeg::makeFrame();
        int err = 0;
        while ((err = avcodec_receive_frame(track.decoder.get(), frame.get())) >= 0) {
            ErrorPtr e = track.in->codecpar->codec_type == AVMEDIA_TYPE_VIDEO
                             ? takeVideo(track, frame.get())
                             : takeAudio(track, frame.get());
            av_frame_unref(frame.get());
            if (e)
                return e;
            if (track.done)
                return nullptr;
        }
        if (err != AVERROR(EAGAIN) && err != AVERROR_EOF)
            return failure(err, QStringLiteral("cannot decode the source"));
        return nullptr;
    }

    void finishTrack(Track& track) {
        if (!track.done) {
            track.done = true;
            --open_;
        }
    }

    ErrorPtr takeVideo(Track& track, AVFrame* frame) {
        const std::int64_t pts = frame->best_effort_timestamp;
        if (pts == AV_NOPTS_VALUE || pts < track.start)
            return nullptr;
        if (pts >= track.end) {
            finishTrack(track);
            return nullptr;
        }
        if (job_.progress)
            job_.progress(float(pts - track.start) /
                          float(std::max<std::int64_t>(1, track.end - track.start)));
        AVCodecContext* c = track.encoder.get();
        AVFrame* input = frame;
        if (frame->format != c->pix_fmt || frame->width != c->width || frame->height != c->height) {
            track.sws.reset(sws_getCachedContext(
                track.sws.release(), frame->width, frame->height, AVPixelFormat(frame->format),
                c->width, c->height, c->pix_fmt, SWS_BICUBIC, nullptr, nullptr, nullptr));
            if (!track.converted) {
                track.converted = ffmpeg::makeFrame();
                track.converted->format = c->pix_fmt;
                track.converted->width = c->width;
                track.converted->height = c->height;
                if (av_frame_get_buffer(track.converted.get(), 0) < 0)
                    return failure(AVERROR(ENOMEM), QStringLiteral("cannot convert a frame"));
            }
            if (!track.sws || av_frame_make_writable(track.converted.get()) < 0)
                return failure(AVERROR(ENOMEM), QStringLiteral("cannot convert a frame"));
            sws_scale(track.sws.get(), frame->data, frame->linesize, 0, frame->height,
                      track.converted->data, track.converted->linesize);
            input = track.converted.get();
        }
        input->pts = pts - track.start;
        input->pict_type = AV_PICTURE_TYPE_NONE;
        return encode(track, input);
    }

    ErrorPtr takeAudio(Track& track, AVFrame* frame) {
        AVCodecContext* c = track.encoder.get();
        const std::int64_t pts = frame->best_effort_timestamp;
        if (pts == AV_NOPTS_VALUE)
            return nullptr;
        const std::int64_t first =
            StreamTime::rescale(pts, track.in->time_base, AVRational{1, c->sample_rate});
        const std::int64_t last = first + frame->nb_samples;
        if (first >= track.end) {
            finishTrack(track);
            return nullptr;
        }
        const std::int64_t from = std::max(first, track.start), to = std::min(last, track.end);
        if (to <= from)
            return nullptr;
        ffmpeg::FramePtr converted = ffmpeg::makeFrame();
        converted->format = c->sample_fmt;
        converted->sample_rate = c->sample_rate;
        converted->nb_samples = frame->nb_samples + 256;
        av_channel_layout_copy(&converted->ch_layout, &c->ch_layout);
        if (av_frame_get_buffer(converted.get(), 0) < 0)
            return failure(AVERROR(ENOMEM), QStringLiteral("cannot convert the audio"));
        const int got =
            swr_convert(track.swr.get(), converted->data, converted->nb_samples,
                        const_cast<const std::uint8_t**>(frame->extended_data), frame->nb_samples);
        if (got < 0)
            return failure(got, QStringLiteral("cannot convert the audio"));
        const int skip = int(from - first);
        const int keep = std::min<int>(int(to - from), got - skip);
        if (keep <= 0)
            return nullptr;
        std::vector<void*> planes(c->ch_layout.nb_channels);
        for (int ch = 0; ch < c->ch_layout.nb_channels; ++ch) {
            float* samples = reinterpret_cast<float*>(converted->extended_data[ch]) + skip;
            if (track.volume != 1.0f)
                for (int k = 0; k < keep; ++k)
                    samples[k] *= track.volume;
            planes[ch] = samples;
        }
        if (av_audio_fifo_write(track.fifo.get(), planes.data(), keep) < keep)
            return failure(AVERROR(ENOMEM), QStringLiteral("cannot queue the audio"));
        if (to >= track.end)
            finishTrack(track);
        return drainFifo(track, false);
    }

    ErrorPtr drainFifo(Track& track, bool all) {
        AVCodecContext* c = track.encoder.get();
        while (av_audio_fifo_size(track.fifo.get()) >= c->frame_size ||
               (all && av_audio_fifo_size(track.fifo.get()) > 0)) {
            const int n = std::min(c->frame_size, av_audio_fifo_size(track.fifo.get()));
            ffmpeg::FramePtr frame = ffmpeg::makeFrame();
            frame->format = c->sample_fmt;
            frame->sample_rate = c->sample_rate;
            frame->nb_samples = n;
            av_channel_layout_copy(&frame->ch_layout, &c->ch_layout);
            if (av_frame_get_buffer(frame.get(), 0) < 0 ||
                av_audio_fifo_read(track.fifo.get(), reinterpret_cast<void**>(frame->data), n) < n)
                return failure(AVERROR(ENOMEM), QStringLiteral("cannot read queued audio"));
            frame->pts = track.samplesOut;
            track.samplesOut += n;
            if (ErrorPtr e = encode(track, frame.get()))
                return e;
        }
        return nullptr;
    }

    ErrorPtr flush(Track& track) {
        if (track.fifo)
            if (ErrorPtr e = drainFifo(track, true))
                return e;
        return encode(track, nullptr);
    }

    ErrorPtr encode(Track& track, AVFrame* frame) {
        int err = avcodec_send_frame(track.encoder.get(), frame);
        if (err < 0)
            return failure(err, QStringLiteral("cannot encode"));
        ffmpeg::PacketPtr packet = ffmpeg::makePacket();
        while ((err = avcodec_receive_packet(track.encoder.get(), packet.get())) >= 0) {
            const AVRational from = track.encoder->time_base, to = track.out->time_base;
            packet->pts = StreamTime::rescale(packet->pts, from, to);
            packet->dts = StreamTime::rescale(packet->dts, from, to);
            packet->duration = StreamTime::rescale(packet->duration, from, to);
            packet->stream_index = track.out->index;
            // The muxer takes the payload; the packet is blank after.
            if ((err = av_interleaved_write_frame(output_.get(), packet.get())) < 0)
                return failure(err, QStringLiteral("cannot write a sample"));
        }
        if (err != AVERROR(EAGAIN) && err != AVERROR_EOF)
            return failure(err, QStringLiteral("cannot encode"));
        return nullptr;
    }

    const ExportJob& job_;
    ffmpeg::InputPtr input_;
    ffmpeg::OutputPtr output_;
    std::vector<Track> tracks_;
    int open_ = 0;
    bool videoOpened_ = false;
};

} // namespace

ErrorPtr runReencodeExport(const ExportJob& job) {
    Reencoder reencoder(job);
    return reencoder.run();
}

} // namespace platform
