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
#include <libswscale/swscale.h>
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
    AudioSynth(const MovieSpec& movieSpec, int track) : spec_(movieSpec), track_(track) {}

    float sample(std::int64_t n) const {
        const double rate = spec_.audioSampleRate;
        const double t = n / rate - (track_ == 0 ? 0.0 : kSecondTrackBurstOffset);
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
        if (t >= 0 && since < kBurstSeconds)
            return static_cast<float>(0.5 * std::sin(2 * M_PI * kBurstFrequency * since));
        const double bed = track_ == 0 ? 220.0 : 290.0;
        return static_cast<float>(0.02 * std::sin(2 * M_PI * bed * t) +
                                  0.02 * std::sin(2 * M_PI * 1.5 * bed * t));
    }

  private:
    MovieSpec spec_;
    int track_;
};

// One audio track being written: its encoder, stream and synthesiser.
struct AudioTrack {
    AudioTrack(const MovieSpec& movieSpec, int index) : synth(movieSpec, index) {}
    AudioSynth synth;
    CodecPtr encoder;
    AVStream* stream = nullptr;
    FramePtr frame;
    std::int64_t samples = 0; // written so far, from the track's own 0
};

const char* formatName(Container container) {
    switch (container) {
    case Container::Matroska:
        return "matroska";
    case Container::WebM:
        return "webm";
    default:
        return "mp4";
    }
}

class Writer {
  public:
    Writer(const QString& path, const MovieSpec& movieSpec) : path_(path), spec_(movieSpec) {}

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
        // The painter draws 4:2:0; other formats are converted from it.
        FramePtr converted;
        SwsContext* sws = nullptr;
        struct SwsFree {
            SwsContext*& s;
            ~SwsFree() { sws_freeContext(s); }
        } swsFree{sws};
        if (video_->pix_fmt != AV_PIX_FMT_YUV420P) {
            converted.reset(av_frame_alloc());
            converted->format = video_->pix_fmt;
            converted->width = spec_.width;
            converted->height = spec_.height;
            sws =
                sws_getContext(spec_.width, spec_.height, AV_PIX_FMT_YUV420P, spec_.width,
                               spec_.height, video_->pix_fmt, SWS_POINT, nullptr, nullptr, nullptr);
            if (!sws || av_frame_get_buffer(converted.get(), 0) < 0)
                return fail(error, QStringLiteral("out of memory"));
        }
        for (int i = 0; i < frames; ++i) {
            if (av_frame_make_writable(frame.get()) < 0 || !painter.paint(frame.get(), i))
                return fail(error, QStringLiteral("cannot paint frame %1").arg(i));
            AVFrame* picture = frame.get();
            if (converted) {
                if (av_frame_make_writable(converted.get()) < 0)
                    return fail(error, QStringLiteral("out of memory"));
                sws_scale(sws, frame->data, frame->linesize, 0, spec_.height, converted->data,
                          converted->linesize);
                picture = converted.get();
            }
            picture->pts = pts(i);
            picture->pict_type = AV_PICTURE_TYPE_NONE;
            durations_[picture->pts] = pts(i + 1) - picture->pts;
            if (!encode(video_.get(), videoStream_, picture))
                return fail(error);
            for (AudioTrack& track : audio_)
                if (!writeAudioUntil(track, frameTime(spec_, i + 1)))
                    return fail(error);
            if (progress && i % 64 == 0)
                progress(double(i) / frames);
        }
        if (!encode(video_.get(), videoStream_, nullptr))
            return fail(error);
        for (AudioTrack& track : audio_)
            if (!writeAudioUntil(track, endSeconds, true) ||
                !encode(track.encoder.get(), track.stream, nullptr))
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
    // In the video encoder's time base.
    std::int64_t pts(int index) const {
        return std::llround((spec_.startSeconds + frameTime(spec_, index)) * video_->time_base.den /
                            video_->time_base.num);
    }

    bool isMp4() const {
        return spec_.container == Container::Mp4 || spec_.container == Container::FragmentedMp4;
    }
    bool isMatroska() const { return !isMp4(); }

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
        // 4:2:0 H.264 and HEVC need even sizes; VP8, VP9 and 4:4:4 take any.
        const bool evenOnly =
            spec_.videoCodec == VideoCodec::H264 || spec_.videoCodec == VideoCodec::HEVC;
        if (spec_.width < 16 || spec_.height < 16 ||
            (evenOnly && (spec_.width % 2 || spec_.height % 2)) || !(spec_.fps > 0) ||
            !(spec_.seconds > 0) || spec_.audioTracks < 0 || spec_.audioTracks > 2) {
            message_ = QStringLiteral("unsupported movie size, rate, length or track count");
            return false;
        }
        if (spec_.container == Container::WebM &&
            ((spec_.videoCodec != VideoCodec::VP8 && spec_.videoCodec != VideoCodec::VP9) ||
             (spec_.audio && spec_.audioCodec == AudioCodec::AAC))) {
            message_ = QStringLiteral("WebM holds VP8 or VP9 with Vorbis or Opus only");
            return false;
        }
        AVFormatContext* oc = nullptr;
        const QByteArray file = QFile::encodeName(path_);
        int err = avformat_alloc_output_context2(&oc, nullptr, formatName(spec_.container),
                                                 file.constData());
        if (err < 0 || !oc) {
            message_ = avText(err);
            return false;
        }
        out_.reset(oc);
        if (!openVideo())
            return false;
        for (int t = 0; spec_.audio && t < spec_.audioTracks; ++t) {
            audio_.emplace_back(spec_, t);
            if (!openAudio(audio_.back()))
                return false;
        }
        if ((err = avio_open(&oc->pb, file.constData(), AVIO_FLAG_WRITE)) < 0) {
            message_ = QStringLiteral("%1: %2").arg(path_, avText(err));
            return false;
        }
        AVDictionary* options = nullptr;
        if (spec_.fastStart)
            av_dict_set(&options, "movflags", "+faststart", 0);
        if (spec_.container == Container::FragmentedMp4)
            av_dict_set(&options, "movflags",
                        spec_.segmentIndex
                            ? "+frag_keyframe+empty_moov+default_base_moof+global_sidx"
                            : "+frag_keyframe+empty_moov+default_base_moof",
                        0);
        // A live recorder writes neither a duration nor cues: when it dies,
        // the file has none.
        if (isMatroska() && spec_.truncated)
            av_dict_set(&options, "live", "1", 0);
        err = avformat_write_header(oc, &options);
        av_dict_free(&options);
        if (err < 0) {
            message_ = avText(err);
            return false;
        }
        return true;
    }

    bool openVideo() {
        static const char* const names[] = {"libx264", "libx264", "libx265", "libvpx",
                                            "libvpx-vp9"};
        const char* name = names[int(spec_.videoCodec)];
        const AVCodec* codec = avcodec_find_encoder_by_name(name);
        if (!codec) {
            message_ = QStringLiteral("no %1 encoder").arg(QLatin1String(name));
            return false;
        }
        video_.reset(avcodec_alloc_context3(codec));
        AVCodecContext* c = video_.get();
        c->width = spec_.width;
        c->height = spec_.height;
        c->pix_fmt =
            spec_.videoCodec == VideoCodec::H264_444 ? AV_PIX_FMT_YUV444P : AV_PIX_FMT_YUV420P;
        // Matroska counts in milliseconds; the encoder gets the muxer's clock
        // so that frame times survive the trip exactly.
        c->time_base = isMatroska() ? AVRational{1, 1000} : AVRational{1, kVideoTimescale};
        c->framerate = av_d2q(spec_.fps, 100000);
        c->gop_size = spec_.keyframeInterval;
        c->keyint_min = spec_.keyframeInterval;
        c->max_b_frames = spec_.bFrames;
        c->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
        const QByteArray preset = spec_.x264Preset.toUtf8();
        switch (spec_.videoCodec) {
        case VideoCodec::H264:
        case VideoCodec::H264_444:
            av_opt_set(c->priv_data, "preset", preset.constData(), 0);
            av_opt_set_double(c->priv_data, "crf", spec_.crf, 0);
            // Keyframes exactly every keyframeInterval frames, so tests know
            // where they are.
            av_opt_set(c->priv_data, "x264-params", "scenecut=0", 0);
            break;
        case VideoCodec::HEVC: {
            av_opt_set(c->priv_data, "preset", preset.constData(), 0);
            av_opt_set_double(c->priv_data, "crf", spec_.crf, 0);
            const QByteArray params =
                QStringLiteral("log-level=error:scenecut=0:bframes=%1").arg(spec_.bFrames).toUtf8();
            av_opt_set(c->priv_data, "x265-params", params.constData(), 0);
            if (isMp4())
                c->codec_tag = MKTAG('h', 'v', 'c', '1');
            break;
        }
        case VideoCodec::VP8:
        case VideoCodec::VP9:
            // As a screen recorder runs the encoder: in real time, no frames
            // held back for reference.
            c->bit_rate = std::max<std::int64_t>(
                200000, std::llround(spec_.width * spec_.height * spec_.fps * 0.3));
            av_opt_set(c->priv_data, "deadline", "realtime", 0);
            av_opt_set_int(c->priv_data, "cpu-used", 8, 0);
            av_opt_set_int(c->priv_data, "lag-in-frames", 0, 0);
            av_opt_set_int(c->priv_data, "auto-alt-ref", 0, 0);
            break;
        }
        int err = avcodec_open2(c, codec, nullptr);
        if (err < 0) {
            message_ = QStringLiteral("%1 encoder: %2").arg(QLatin1String(name), avText(err));
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

    bool openAudio(AudioTrack& track) {
        static const char* const names[] = {"aac", "libvorbis", "libopus"};
        const char* name = names[int(spec_.audioCodec)];
        const AVCodec* codec = avcodec_find_encoder_by_name(name);
        if (!codec) {
            message_ = QStringLiteral("no %1 encoder").arg(QLatin1String(name));
            return false;
        }
        track.encoder.reset(avcodec_alloc_context3(codec));
        AVCodecContext* c = track.encoder.get();
        // Opus runs at 48 kHz and takes interleaved samples.
        const bool opus = spec_.audioCodec == AudioCodec::Opus;
        c->sample_fmt = opus ? AV_SAMPLE_FMT_FLT : AV_SAMPLE_FMT_FLTP;
        c->sample_rate = opus ? 48000 : spec_.audioSampleRate;
        av_channel_layout_default(&c->ch_layout, 2);
        c->bit_rate = 128000;
        c->time_base = {1, c->sample_rate};
        c->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
        int err = avcodec_open2(c, codec, nullptr);
        if (err < 0) {
            message_ = QStringLiteral("%1 encoder: %2").arg(QLatin1String(name), avText(err));
            return false;
        }
        track.stream = avformat_new_stream(out_.get(), nullptr);
        track.stream->time_base = c->time_base;
        avcodec_parameters_from_context(track.stream->codecpar, c);
        // A late-starting track simply begins its samples later.
        track.samples = std::llround(spec_.audioStart * c->sample_rate);
        return true;
    }

    // Writes whole frames up to `seconds`; the final call also writes the
    // short frame that ends the track exactly there.
    bool writeAudioUntil(AudioTrack& track, double seconds, bool final = false) {
        AVCodecContext* c = track.encoder.get();
        const std::int64_t end = std::llround(seconds * c->sample_rate);
        // Vorbis takes frames of any length; a small one keeps the track's
        // end close to the video's.
        const int frameSize = c->frame_size > 0 ? c->frame_size : 1024;
        const std::int64_t offset = std::llround(spec_.startSeconds * c->sample_rate);
        while (track.samples + (final ? 1 : frameSize) <= end) {
            const int n = int(std::min<std::int64_t>(frameSize, end - track.samples));
            if (!track.frame || track.frame->nb_samples != n) {
                track.frame.reset(av_frame_alloc());
                track.frame->format = c->sample_fmt;
                track.frame->nb_samples = n;
                track.frame->sample_rate = c->sample_rate;
                av_channel_layout_copy(&track.frame->ch_layout, &c->ch_layout);
                if (av_frame_get_buffer(track.frame.get(), 0) < 0)
                    return false;
            }
            if (av_frame_make_writable(track.frame.get()) < 0)
                return false;
            AVFrame* f = track.frame.get();
            const double scale = double(spec_.audioSampleRate) / c->sample_rate;
            for (int k = 0; k < n; ++k) {
                const float v = track.synth.sample(std::llround((track.samples + k) * scale));
                if (c->sample_fmt == AV_SAMPLE_FMT_FLT) {
                    auto* both = reinterpret_cast<float*>(f->data[0]);
                    both[2 * k] = both[2 * k + 1] = v;
                } else {
                    reinterpret_cast<float*>(f->data[0])[k] = v;
                    reinterpret_cast<float*>(f->data[1])[k] = v;
                }
            }
            f->pts = offset + track.samples;
            track.samples += n;
            if (!encode(c, track.stream, f))
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
    QString message_ = QStringLiteral("cannot write the movie");
    OutputPtr out_;
    CodecPtr video_;
    AVStream* videoStream_ = nullptr;
    std::vector<AudioTrack> audio_;
    std::map<std::int64_t, std::int64_t> durations_;
};

} // namespace

QString suffixFor(const MovieSpec& movieSpec) {
    switch (movieSpec.container) {
    case Container::Matroska:
        return QStringLiteral(".mkv");
    case Container::WebM:
        return QStringLiteral(".webm");
    default:
        return QStringLiteral(".mp4");
    }
}

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
