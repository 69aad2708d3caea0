#include "MediaGenerator.h"

#include "platform/media/FFmpegHandles.h"

#include "FramePainter.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>

#include <cmath>
#include <map>
#include <memory>
#include <mutex>

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
#include <libavutil/channel_layout.h>
#include <libavutil/opt.h>
}

namespace testmedia {
namespace {

using platform::ffmpeg::CodecPtr;
using platform::ffmpeg::FramePtr;
using platform::ffmpeg::OutputPtr;
using platform::ffmpeg::PacketPtr;

constexpr int kVideoTimescale = 90000;

QString avText(int err) {
    char buf[AV_ERROR_MAX_STRING_SIZE] = {};
    av_strerror(err, buf, sizeof buf);
    return QString::fromUtf8(buf);
}

// The display matrix of a clockwise turn, with the translation that keeps
// the turned picture in the positive quadrant (as phones write it).
void rotationMatrix(int degrees, int w, int h, std::int32_t m[9]) {
    std::fill(m, m + 9, 0);
    const std::int32_t one = 1 << 16;
    m[8] = 1 << 30;
    switch (((degrees % 360) + 360) % 360) {
    case 90:
        m[1] = one, m[3] = -one, m[6] = h * one;
        break;
    case 180:
        m[0] = -one, m[4] = -one, m[6] = w * one, m[7] = h * one;
        break;
    case 270:
        m[1] = -one, m[3] = one, m[7] = w * one;
        break;
    default:
        m[0] = one, m[4] = one;
    }
}

// Audio: a quiet two-note bed with a short loud burst at every whole second
// (the sync mark), or, for the scene, a soft chime that walks a pentatonic
// scale once a second.
class AudioSynth {
  public:
    explicit AudioSynth(const MovieSpec& movieSpec) : spec_(movieSpec) {}

    float sample(std::int64_t n) const {
        const double rate = spec_.audioSampleRate;
        const double t = n / rate;
        const double second = std::floor(t);
        const double since = t - second;
        if (spec_.scene) {
            static const double scale[] = {392.0, 440.0, 523.25, 587.33, 659.25};
            const double f = scale[static_cast<int>(second) % 5];
            const double chime =
                0.22 * std::exp(-since * 3.5) *
                (std::sin(2 * M_PI * f * since) + 0.3 * std::sin(2 * M_PI * 2 * f * since));
            const double pad = 0.03 * std::sin(2 * M_PI * 196.0 * t);
            return static_cast<float>(chime + pad);
        }
        if (since < kBurstSeconds)
            return static_cast<float>(0.5 * std::sin(2 * M_PI * kBurstFrequency * since));
        return static_cast<float>(0.02 * std::sin(2 * M_PI * 220.0 * t) +
                                  0.02 * std::sin(2 * M_PI * 330.0 * t));
    }

  private:
    MovieSpec spec_;
};

class Writer {
  public:
    Writer(const QString& path, const MovieSpec& movieSpec)
        : path_(path), spec_(movieSpec), synth_(movieSpec) {}

    bool run(QString* error, const std::function<void(double)>& progress) {
        if (!open())
            return fail(error);
        FramePainter painter(spec_);
        const int frames = frameCount(spec_);
        const double endSeconds = frameTime(spec_, frames - 1) + 1.0 / spec_.fps;
        FramePtr frame(av_frame_alloc());
        frame->format = AV_PIX_FMT_YUV420P;
        frame->width = spec_.width;
        frame->height = spec_.height;
        if (av_frame_get_buffer(frame.get(), 0) < 0)
            return fail(error, QStringLiteral("out of memory"));
        for (int i = 0; i < frames; ++i) {
            if (av_frame_make_writable(frame.get()) < 0 || !painter.paint(frame.get(), i))
                return fail(error, QStringLiteral("cannot paint frame %1").arg(i));
            frame->pts = pts(i);
            frame->pict_type = AV_PICTURE_TYPE_NONE;
            durations_[frame->pts] = pts(i + 1) - frame->pts;
            if (!encode(video_.get(), videoStream_, frame.get()))
                return fail(error);
            if (audio_ && !writeAudioUntil(frameTime(spec_, i + 1)))
                return fail(error);
            if (progress && i % 64 == 0)
                progress(double(i) / frames);
        }
        if (!encode(video_.get(), videoStream_, nullptr))
            return fail(error);
        if (audio_ &&
            (!writeAudioUntil(endSeconds, true) || !encode(audio_.get(), audioStream_, nullptr)))
            return fail(error);
        int err = av_write_trailer(out_.get());
        if (err < 0)
            return fail(error, avText(err));
        out_.reset();
        if (spec_.truncated && !truncate())
            return fail(error, QStringLiteral("cannot cut the file short"));
        if (progress)
            progress(1.0);
        return true;
    }

  private:
    std::int64_t pts(int index) const {
        return std::llround(frameTime(spec_, index) * kVideoTimescale);
    }

    bool fail(QString* error, const QString& message = QString()) {
        if (!message.isEmpty())
            message_ = message;
        if (error)
            *error = message_;
        out_.reset();
        QFile::remove(path_);
        return false;
    }

    bool open() {
        if (spec_.width < 16 || spec_.height < 16 || spec_.width % 2 || spec_.height % 2 ||
            !(spec_.fps > 0) || !(spec_.seconds > 0)) {
            message_ = QStringLiteral("unsupported movie size, rate or length");
            return false;
        }
        AVFormatContext* oc = nullptr;
        const QByteArray file = QFile::encodeName(path_);
        int err = avformat_alloc_output_context2(&oc, nullptr, "mp4", file.constData());
        if (err < 0 || !oc) {
            message_ = avText(err);
            return false;
        }
        out_.reset(oc);
        if (!openVideo() || (spec_.audio && !openAudio()))
            return false;
        if ((err = avio_open(&oc->pb, file.constData(), AVIO_FLAG_WRITE)) < 0) {
            message_ = QStringLiteral("%1: %2").arg(path_, avText(err));
            return false;
        }
        AVDictionary* options = nullptr;
        if (spec_.fastStart)
            av_dict_set(&options, "movflags", "+faststart", 0);
        err = avformat_write_header(oc, &options);
        av_dict_free(&options);
        if (err < 0) {
            message_ = avText(err);
            return false;
        }
        return true;
    }

    bool openVideo() {
        const AVCodec* codec = avcodec_find_encoder_by_name("libx264");
        if (!codec) {
            message_ = QStringLiteral("no H.264 encoder");
            return false;
        }
        video_.reset(avcodec_alloc_context3(codec));
        AVCodecContext* c = video_.get();
        c->width = spec_.width;
        c->height = spec_.height;
        c->pix_fmt = AV_PIX_FMT_YUV420P;
        c->time_base = {1, kVideoTimescale};
        c->framerate = av_d2q(spec_.fps, 100000);
        c->gop_size = spec_.keyframeInterval;
        c->keyint_min = spec_.keyframeInterval;
        c->max_b_frames = spec_.bFrames;
        c->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
        av_opt_set(c->priv_data, "preset", spec_.x264Preset.toUtf8().constData(), 0);
        av_opt_set_double(c->priv_data, "crf", spec_.crf, 0);
        // Keyframes exactly every keyframeInterval frames, so tests know where
        // they are.
        av_opt_set(c->priv_data, "x264-params", "scenecut=0", 0);
        int err = avcodec_open2(c, codec, nullptr);
        if (err < 0) {
            message_ = QStringLiteral("H.264 encoder: %1").arg(avText(err));
            return false;
        }
        videoStream_ = avformat_new_stream(out_.get(), nullptr);
        videoStream_->time_base = c->time_base;
        videoStream_->avg_frame_rate = c->framerate;
        avcodec_parameters_from_context(videoStream_->codecpar, c);
        if (spec_.rotationDegrees % 360 != 0) {
            auto* matrix = reinterpret_cast<std::int32_t*>(
                av_stream_new_side_data(videoStream_, AV_PKT_DATA_DISPLAYMATRIX, 9 * 4));
            if (!matrix) {
                message_ = QStringLiteral("out of memory");
                return false;
            }
            rotationMatrix(spec_.rotationDegrees, spec_.width, spec_.height, matrix);
        }
        return true;
    }

    bool openAudio() {
        const AVCodec* codec = avcodec_find_encoder(AV_CODEC_ID_AAC);
        if (!codec) {
            message_ = QStringLiteral("no AAC encoder");
            return false;
        }
        audio_.reset(avcodec_alloc_context3(codec));
        AVCodecContext* c = audio_.get();
        c->sample_fmt = AV_SAMPLE_FMT_FLTP;
        c->sample_rate = spec_.audioSampleRate;
        av_channel_layout_default(&c->ch_layout, 2);
        c->bit_rate = 128000;
        c->time_base = {1, c->sample_rate};
        c->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
        int err = avcodec_open2(c, codec, nullptr);
        if (err < 0) {
            message_ = QStringLiteral("AAC encoder: %1").arg(avText(err));
            return false;
        }
        audioStream_ = avformat_new_stream(out_.get(), nullptr);
        audioStream_->time_base = c->time_base;
        avcodec_parameters_from_context(audioStream_->codecpar, c);
        // A late-starting track simply begins its samples later.
        audioSamples_ = std::llround(spec_.audioStart * c->sample_rate);
        audioFrame_.reset(av_frame_alloc());
        audioFrame_->format = c->sample_fmt;
        audioFrame_->nb_samples = c->frame_size;
        audioFrame_->sample_rate = c->sample_rate;
        av_channel_layout_copy(&audioFrame_->ch_layout, &c->ch_layout);
        if (av_frame_get_buffer(audioFrame_.get(), 0) < 0) {
            message_ = QStringLiteral("out of memory");
            return false;
        }
        return true;
    }

    // Writes whole frames up to `seconds`; the final call also writes the
    // short frame that ends the track exactly there.
    bool writeAudioUntil(double seconds, bool final = false) {
        const std::int64_t end = std::llround(seconds * spec_.audioSampleRate);
        const int frameSize = audio_->frame_size;
        while (audioSamples_ + (final ? 1 : frameSize) <= end) {
            const int n = int(std::min<std::int64_t>(frameSize, end - audioSamples_));
            if (n < frameSize) {
                audioFrame_.reset(av_frame_alloc());
                audioFrame_->format = audio_->sample_fmt;
                audioFrame_->nb_samples = n;
                audioFrame_->sample_rate = audio_->sample_rate;
                av_channel_layout_copy(&audioFrame_->ch_layout, &audio_->ch_layout);
                if (av_frame_get_buffer(audioFrame_.get(), 0) < 0)
                    return false;
            }
            if (av_frame_make_writable(audioFrame_.get()) < 0)
                return false;
            auto* left = reinterpret_cast<float*>(audioFrame_->data[0]);
            auto* right = reinterpret_cast<float*>(audioFrame_->data[1]);
            for (int k = 0; k < n; ++k)
                left[k] = right[k] = synth_.sample(audioSamples_ + k);
            audioFrame_->pts = audioSamples_;
            audioSamples_ += n;
            if (!encode(audio_.get(), audioStream_, audioFrame_.get()))
                return false;
        }
        return true;
    }

    bool encode(AVCodecContext* c, AVStream* stream, AVFrame* frame) {
        int err = avcodec_send_frame(c, frame);
        if (err < 0) {
            message_ = QStringLiteral("encoder: %1").arg(avText(err));
            return false;
        }
        PacketPtr packet(av_packet_alloc());
        while ((err = avcodec_receive_packet(c, packet.get())) >= 0) {
            if (c == video_.get()) {
                const auto it = durations_.find(packet->pts);
                if (it != durations_.end()) {
                    packet->duration = it->second;
                    durations_.erase(it);
                }
            }
            av_packet_rescale_ts(packet.get(), c->time_base, stream->time_base);
            packet->stream_index = stream->index;
            // The muxer takes the packet's payload; the packet is blank after.
            if ((err = av_interleaved_write_frame(out_.get(), packet.get())) < 0) {
                message_ = QStringLiteral("muxer: %1").arg(avText(err));
                return false;
            }
        }
        if (err != AVERROR(EAGAIN) && err != AVERROR_EOF) {
            message_ = QStringLiteral("encoder: %1").arg(avText(err));
            return false;
        }
        return true;
    }

    bool truncate() {
        QFile file(path_);
        const qint64 size = file.size();
        return size > 0 && file.resize(size * 55 / 100);
    }

    QString path_;
    MovieSpec spec_;
    AudioSynth synth_;
    QString message_ = QStringLiteral("cannot write the movie");
    OutputPtr out_;
    CodecPtr video_, audio_;
    AVStream* videoStream_ = nullptr;
    AVStream* audioStream_ = nullptr;
    FramePtr audioFrame_;
    std::int64_t audioSamples_ = 0;
    std::map<std::int64_t, std::int64_t> durations_;
};

} // namespace

int frameCount(const MovieSpec& movieSpec) {
    if (!(movieSpec.fps > 0) || !(movieSpec.seconds > 0))
        return 0;
    return std::max(1, static_cast<int>(std::llround(movieSpec.seconds * movieSpec.fps)));
}

double frameTime(const MovieSpec& movieSpec, int index) {
    if (!movieSpec.variableFrameRate || index == 0)
        return index / movieSpec.fps;
    // Up to 0.45 frame early or late, never out of order (steps run from
    // about 0.6 to 1.4 frames).
    return (index + 0.45 * std::sin(0.9 * index)) / movieSpec.fps;
}

bool writeMovie(const QString& hostPath, const MovieSpec& movieSpec, QString* error) {
    return writeMovie(hostPath, movieSpec, error, {});
}

bool writeMovie(const QString& hostPath, const MovieSpec& movieSpec, QString* error,
                const std::function<void(double)>& progress) {
    if (!QFileInfo(hostPath).absoluteDir().exists()) {
        if (error)
            *error =
                QStringLiteral("no such directory: %1").arg(QFileInfo(hostPath).absolutePath());
        return false;
    }
    // x264 reports its settings at info level on every movie; the generator's
    // callers want only errors on stderr.
    static std::once_flag quiet;
    std::call_once(quiet, [] { av_log_set_level(AV_LOG_ERROR); });
    Writer writer(hostPath, movieSpec);
    return writer.run(error, progress);
}

} // namespace testmedia
