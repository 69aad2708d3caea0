#include "ClipMuxer.h"

#include "Asset.h"
#include "DecodeTimes.h"
#include "StreamTime.h"

#include <QFile>

namespace platform {

std::unique_ptr<ClipMuxer> ClipMuxer::create(const QString& hostPath, ErrorPtr* error) {
    std::unique_ptr<ClipMuxer> muxer(new ClipMuxer);
    muxer->path_ = QFile::encodeName(hostPath);
    AVFormatContext* raw = nullptr;
    const int err = avformat_alloc_output_context2(&raw, nullptr, "mp4", muxer->path_.constData());
    if (err < 0 || !raw) {
        setError(error, ffmpeg::failure(err < 0 ? err : AVERROR(ENOMEM),
                                        QStringLiteral("cannot make the output")));
        return {};
    }
    muxer->output_.reset(raw);
    return muxer;
}

AVStream* ClipMuxer::addStream() {
    AVStream* stream = avformat_new_stream(output_.get(), nullptr);
    if (stream)
        lastDts_.push_back(AV_NOPTS_VALUE);
    return stream;
}

ErrorPtr ClipMuxer::begin() {
    int err = avio_open(&output_->pb, path_.constData(), AVIO_FLAG_WRITE);
    if (err < 0)
        return ffmpeg::failure(err, QStringLiteral("cannot write the output"));
    if ((err = avformat_write_header(output_.get(), nullptr)) < 0)
        return ffmpeg::failure(err, QStringLiteral("cannot write the output header"));
    return nullptr;
}

int ClipMuxer::write(AVPacket* packet, AVStream* stream, AVRational timeBase) {
    const AVRational to = stream->time_base;
    DecodeTimes::Stamp stamp{StreamTime::rescale(packet->dts, timeBase, to),
                             StreamTime::rescale(packet->pts, timeBase, to),
                             StreamTime::rescale(packet->duration, timeBase, to)};
    // Rounding into a coarser time base, or a source whose decode times
    // stall, must not make the muxer refuse the clip.
    std::int64_t& last = lastDts_[stream->index];
    last = DecodeTimes::keepRising(stamp, last);
    packet->dts = stamp.dts;
    packet->pts = stamp.pts;
    packet->duration = stamp.duration;
    packet->stream_index = stream->index;
    packet->pos = -1;
    return av_interleaved_write_frame(output_.get(), packet);
}

ErrorPtr ClipMuxer::finish() {
    if (const int err = av_write_trailer(output_.get()); err < 0)
        return ffmpeg::failure(err, QStringLiteral("cannot finish the output"));
    output_.reset();
    return nullptr;
}

} // namespace platform
