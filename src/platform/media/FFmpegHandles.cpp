#include "FFmpegHandles.h"

#include "SourceEnds.h"

#include <QFile>

#include <cerrno>
#include <fcntl.h>
#include <mutex>
#include <sys/stat.h>
#include <unistd.h>

namespace platform::ffmpeg {

QString errorText(int averror) {
    if (averror == kNotARegularFile)
        return QStringLiteral("not a regular file (a pipe, a device, a socket or a folder)");
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

    // A pipe, a device or a folder would have FFmpeg wait on it, maybe for
    // good: only a regular file is read, and through the descriptor that was
    // checked, so the name cannot be swapped for something else meanwhile.
    const int fd = ::open(QFile::encodeName(hostPath).constData(),
                          O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY);
    if (fd < 0) {
        if (averror)
            *averror = AVERROR(errno);
        return {};
    }
    struct stat info {};
    if (::fstat(fd, &info) != 0 || !S_ISREG(info.st_mode)) {
        ::close(fd);
        if (averror)
            *averror = kNotARegularFile;
        return {};
    }
    AVFormatContext* raw = nullptr;
    const QByteArray name = QByteArrayLiteral("/proc/self/fd/") + QByteArray::number(fd);
    int err = avformat_open_input(&raw, name.constData(), nullptr, nullptr);
    ::close(fd); // FFmpeg has a descriptor of its own on the same file
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
