#include "ClipProbe.h"

#include "MediaGenerator.h"

#include <QFile>

#include <atomic>
#include <cmath>
#include <map>

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
#include <libavutil/display.h>
}

namespace mediatest {
namespace {

std::atomic<int> errorLines{0};

void countErrors(void*, int level, const char*, va_list) {
    if (level <= AV_LOG_ERROR)
        ++errorLines;
}

struct Closer {
    AVFormatContext* in = nullptr;
    AVCodecContext* video = nullptr;
    AVCodecContext* audio = nullptr;
    AVPacket* packet = av_packet_alloc();
    AVFrame* frame = av_frame_alloc();
    ~Closer() {
        av_frame_free(&frame);
        av_packet_free(&packet);
        avcodec_free_context(&video);
        avcodec_free_context(&audio);
        avformat_close_input(&in);
    }
};

AVCodecContext* openDecoder(AVStream* stream) {
    const AVCodec* codec = avcodec_find_decoder(stream->codecpar->codec_id);
    AVCodecContext* c = avcodec_alloc_context3(codec);
    avcodec_parameters_to_context(c, stream->codecpar);
    c->pkt_timebase = stream->time_base;
    c->thread_count = 1;
    if (avcodec_open2(c, codec, nullptr) < 0)
        avcodec_free_context(&c);
    return c;
}

} // namespace

ClipInfo probeClip(const QString& path, int maxFrames) {
    ClipInfo info;
    errorLines = 0;
    av_log_set_callback(countErrors);
    struct Restore {
        ~Restore() { av_log_set_callback(av_log_default_callback); }
    } restore;
    Closer k;
    if (avformat_open_input(&k.in, QFile::encodeName(path).constData(), nullptr, nullptr) < 0 ||
        avformat_find_stream_info(k.in, nullptr) < 0)
        return info;
    info.opened = true;
    info.format = QString::fromLatin1(k.in->iformat->name);
    if (k.in->start_time != AV_NOPTS_VALUE)
        info.startTime = k.in->start_time / double(AV_TIME_BASE);
    int videoIndex = -1, audioIndex = -1;
    for (unsigned i = 0; i < k.in->nb_streams; ++i) {
        AVStream* s = k.in->streams[i];
        if (s->codecpar->codec_type == AVMEDIA_TYPE_VIDEO) {
            if (videoIndex < 0) {
                videoIndex = int(i);
                info.videoCodec = QString::fromLatin1(avcodec_get_name(s->codecpar->codec_id));
                info.videoDuration = s->duration * av_q2d(s->time_base);
                size_t size = 0;
                if (const auto* m = reinterpret_cast<const int32_t*>(
                        av_stream_get_side_data(s, AV_PKT_DATA_DISPLAYMATRIX, &size)))
                    info.transform = QTransform(m[0] / 65536.0, m[1] / 65536.0, m[3] / 65536.0,
                                                m[4] / 65536.0, m[6] / 65536.0, m[7] / 65536.0);
            }
        } else if (s->codecpar->codec_type == AVMEDIA_TYPE_AUDIO) {
            ++info.audioTracks;
            if (audioIndex < 0) {
                audioIndex = int(i);
                info.audioCodec = QString::fromLatin1(avcodec_get_name(s->codecpar->codec_id));
                info.audioDuration = s->duration * av_q2d(s->time_base);
            }
        }
    }
    if (videoIndex >= 0)
        k.video = openDecoder(k.in->streams[videoIndex]);
    if (audioIndex >= 0)
        k.audio = openDecoder(k.in->streams[audioIndex]);

    auto drain = [&](AVCodecContext* c, int index) {
        const AVRational tb = k.in->streams[index]->time_base;
        while (avcodec_receive_frame(c, k.frame) >= 0) {
            const double t = k.frame->best_effort_timestamp * av_q2d(tb);
            if (c == k.video) {
                if (maxFrames < 0 || int(info.frames.size()) < maxFrames)
                    info.frames.push_back(
                        {t, testmedia::readFrameIndex(k.frame->data[0], k.frame->width,
                                                      k.frame->height, k.frame->linesize[0])});
            } else if (k.frame->format == AV_SAMPLE_FMT_FLTP) {
                info.audioStart = std::min(info.audioStart, t);
                info.audioEnd =
                    std::max(info.audioEnd, t + double(k.frame->nb_samples) / k.frame->sample_rate);
                const float* samples = reinterpret_cast<const float*>(k.frame->extended_data[0]);
                for (int n = 0; n < k.frame->nb_samples; ++n) {
                    const double v = std::fabs(samples[n]);
                    info.audioPeak = std::max(info.audioPeak, v);
                    const double at = t + double(n) / k.frame->sample_rate;
                    // Bursts are a second apart; the first loud sample after a
                    // long quiet is the onset.
                    if (v > 0.25 &&
                        (info.burstOnsets.empty() || at - info.burstOnsets.back() > 0.3))
                        info.burstOnsets.push_back(at);
                }
            }
            av_frame_unref(k.frame);
        }
    };
    std::map<int, std::int64_t> lastDts;
    while (av_read_frame(k.in, k.packet) >= 0) {
        const int index = k.packet->stream_index;
        if (k.packet->dts != AV_NOPTS_VALUE) {
            const auto last = lastDts.find(index);
            if (last != lastDts.end() && k.packet->dts <= last->second)
                info.decodeTimesRise = false;
            lastDts[index] = k.packet->dts;
        }
        if (index == videoIndex && (k.packet->flags & AV_PKT_FLAG_KEY))
            info.keyframes.append(
                QByteArray(reinterpret_cast<const char*>(k.packet->data), k.packet->size));
        AVCodecContext* c = index == videoIndex ? k.video : index == audioIndex ? k.audio : nullptr;
        if (c) {
            avcodec_send_packet(c, k.packet);
            drain(c, index);
        }
        av_packet_unref(k.packet);
    }
    if (k.video) {
        avcodec_send_packet(k.video, nullptr);
        drain(k.video, videoIndex);
    }
    if (k.audio) {
        avcodec_send_packet(k.audio, nullptr);
        drain(k.audio, audioIndex);
    }
    info.errorLines = errorLines;
    return info;
}

} // namespace mediatest
