#include "FFmpegHandles.h"

#include "SourceEnds.h"

#include <QFile>

#include <algorithm>
#include <cerrno>
#include <fcntl.h>
#include <mutex>
#include <sys/stat.h>
#include <unistd.h>

namespace platform::ffmpeg {

namespace {

// What probing works out when it runs: the movie's start, the earliest of
// its streams', and its length, to the end of the last one (AV_TIME_BASE
// units). Times a hostile file makes overflow are left unknown.
void takeMovieTimesFromStreams(AVFormatContext* input) {
    std::int64_t first = INT64_MAX, last = INT64_MIN;
    for (unsigned i = 0; i < input->nb_streams; ++i) {
        const AVStream* stream = input->streams[i];
        const std::int64_t start =
            av_rescale_q(stream->start_time, stream->time_base, AV_TIME_BASE_Q);
        first = std::min(first, start);
        std::int64_t end = 0;
        if (stream->duration != AV_NOPTS_VALUE &&
            !__builtin_add_overflow(
                start, av_rescale_q(stream->duration, stream->time_base, AV_TIME_BASE_Q), &end))
            last = std::max(last, end);
    }
    if (input->start_time == AV_NOPTS_VALUE && first != INT64_MAX)
        input->start_time = first;
    std::int64_t length = 0;
    if (input->duration == AV_NOPTS_VALUE && last != INT64_MIN && first != INT64_MAX &&
        !__builtin_sub_overflow(last, first, &length) && length > 0)
        input->duration = length;
}

} // namespace

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
    // Probing decodes the start of each stream (tens of milliseconds for a
    // large picture), so it runs only when the headers leave out something
    // we read: a stream's start time (Matroska's B-frames, say), a video
    // stream's size, an audio stream's sample rate, or the pixel format that
    // an MP4 VP8 or VP9 configuration box is made from. H.264 and HEVC carry
    // theirs in their own configuration, which is copied as it is, so a plain
    // MP4 recording opens on its headers alone; the movie's start and length
    // are then reckoned from its streams, as probing would.
    bool complete = input->nb_streams > 0;
    for (unsigned i = 0; i < input->nb_streams; ++i) {
        const AVStream* stream = input->streams[i];
        const AVCodecParameters* p = stream->codecpar;
        if (stream->start_time == AV_NOPTS_VALUE)
            complete = false;
        const bool formatInConfiguration =
            p->codec_id == AV_CODEC_ID_H264 || p->codec_id == AV_CODEC_ID_HEVC;
        if ((p->codec_type == AVMEDIA_TYPE_VIDEO &&
             (p->width <= 0 || (p->format < 0 && !formatInConfiguration))) ||
            (p->codec_type == AVMEDIA_TYPE_AUDIO && p->sample_rate <= 0))
            complete = false;
    }
    if (!complete && (err = avformat_find_stream_info(input.get(), nullptr)) < 0) {
        if (averror)
            *averror = err;
        return {};
    }
    if (complete)
        takeMovieTimesFromStreams(input.get());
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
