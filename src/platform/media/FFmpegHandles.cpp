#include "FFmpegHandles.h"

#include "SourceEnds.h"

#include <QFile>

#include <mutex>

namespace platform::ffmpeg {

QString errorText(int averror) {
    char buf[AV_ERROR_MAX_STRING_SIZE] = {};
    av_strerror(averror, buf, sizeof buf);
    return QString::fromUtf8(buf);
}

InputPtr openInput(const QString& hostPath, int* averror) {
    InputPtr input = openInputAsIs(hostPath, averror);
    if (input)
        settleEnds(input.get(), hostPath);
    return input;
}

InputPtr openInputAsIs(const QString& hostPath, int* averror) {
    // FFmpeg chats on stderr at info level (encoder settings and the like);
    // its errors are all we want there, ours go to the system log.
    static std::once_flag quiet;
    std::call_once(quiet, [] { av_log_set_level(AV_LOG_ERROR); });

    AVFormatContext* raw = nullptr;
    const QByteArray name = QFile::encodeName(hostPath);
    int err = avformat_open_input(&raw, name.constData(), nullptr, nullptr);
    if (err < 0) {
        if (averror)
            *averror = err;
        return {};
    }
    InputPtr input(raw);
    // Probing decodes the start of each stream, so it runs only when the
    // headers leave out a parameter we read: a video stream's size or pixel
    // format, an audio stream's sample rate. The MP4 and Matroska demuxers
    // leave the pixel format unset for H.264 and VP9, so in practice a file
    // with video is probed, MP4 included; a file with only audio is not.
    bool complete = input->nb_streams > 0;
    for (unsigned i = 0; i < input->nb_streams; ++i) {
        const AVCodecParameters* p = input->streams[i]->codecpar;
        if ((p->codec_type == AVMEDIA_TYPE_VIDEO && (p->width <= 0 || p->format < 0)) ||
            (p->codec_type == AVMEDIA_TYPE_AUDIO && p->sample_rate <= 0))
            complete = false;
    }
    if (!complete && (err = avformat_find_stream_info(input.get(), nullptr)) < 0) {
        if (averror)
            *averror = err;
        return {};
    }
    return input;
}

CodecPtr openDecoder(const AVStream* stream, int threads, int* averror) {
    const AVCodec* codec = avcodec_find_decoder(stream->codecpar->codec_id);
    if (!codec) {
        if (averror)
            *averror = AVERROR_DECODER_NOT_FOUND;
        return {};
    }
    CodecPtr context(avcodec_alloc_context3(codec));
    if (!context) {
        if (averror)
            *averror = AVERROR(ENOMEM);
        return {};
    }
    int err = avcodec_parameters_to_context(context.get(), stream->codecpar);
    if (err >= 0) {
        context->pkt_timebase = stream->time_base;
        context->thread_count = threads;
        err = avcodec_open2(context.get(), codec, nullptr);
    }
    if (err < 0) {
        if (averror)
            *averror = err;
        return {};
    }
    return context;
}

} // namespace platform::ffmpeg
