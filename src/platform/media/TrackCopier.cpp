#include "TrackCopier.h"

#include <algorithm>

namespace platform {
namespace {

bool copyDisplayMatrix(const AVStream* from, AVStream* to) {
    size_t size = 0;
    const std::uint8_t* matrix = av_stream_get_side_data(from, AV_PKT_DATA_DISPLAYMATRIX, &size);
    if (!matrix)
        return true;
    std::uint8_t* copy = av_stream_new_side_data(to, AV_PKT_DATA_DISPLAYMATRIX, size);
    if (!copy)
        return false;
    std::copy(matrix, matrix + size, copy);
    return true;
}

} // namespace

std::unique_ptr<TrackCopier> TrackCopier::create(AVStream* source, ClipMuxer& muxer) {
    AVStream* out = muxer.addStream();
    if (!out || avcodec_parameters_copy(out->codecpar, source->codecpar) < 0 ||
        !copyDisplayMatrix(source, out))
        return {};
    // The source container's tag may mean nothing in MP4; the muxer picks.
    out->codecpar->codec_tag = 0;
    out->time_base = source->time_base;
    out->disposition = source->disposition;
    out->avg_frame_rate = source->avg_frame_rate;
    return std::unique_ptr<TrackCopier>(new TrackCopier(source, out, muxer));
}

int TrackCopier::take(AVPacket* packet) {
    if (done_) {
        av_packet_unref(packet);
        return 0;
    }
    const bool video = source_->codecpar->codec_type == AVMEDIA_TYPE_VIDEO;
    const std::int64_t reached =
        (video && packet->dts != AV_NOPTS_VALUE) || packet->pts == AV_NOPTS_VALUE ? packet->dts
                                                                                  : packet->pts;
    if (reached != AV_NOPTS_VALUE && reached >= cut_.stopAt) {
        done_ = true;
        av_packet_unref(packet);
        return 0;
    }
    if (packet->pts != AV_NOPTS_VALUE)
        packet->pts -= cut_.offset;
    if (packet->dts != AV_NOPTS_VALUE)
        packet->dts -= cut_.offset;
    packet->flags &= ~AV_PKT_FLAG_DISCARD;
    ffmpeg::PacketPtr kept = ffmpeg::makePacket();
    av_packet_move_ref(kept.get(), packet);
    const std::int64_t dts = kept->dts;
    waiting_.push_back(std::move(kept));
    return dts == AV_NOPTS_VALUE ? 0 : release(dts);
}

// The waiting packets before the last (which has `nextDts`, or none) get
// decode times; all but the newest are written.
int TrackCopier::release(std::int64_t nextDts) {
    const size_t without = waiting_.size() - (nextDts == DecodeTimes::kNone ? 0 : 1);
    if (without > 0) {
        std::vector<DecodeTimes::Stamp> run;
        for (size_t i = 0; i < without; ++i)
            run.push_back({DecodeTimes::kNone, waiting_[i]->pts, waiting_[i]->duration});
        DecodeTimes::fillRun(run, nextDts, lastDts_);
        for (size_t i = 0; i < without; ++i)
            waiting_[i]->dts = run[i].dts;
    }
    for (auto& packet : waiting_) {
        if (held_)
            if (const int err = write(held_); err < 0)
                return err;
        held_ = std::move(packet);
        lastDts_ = held_->dts;
    }
    waiting_.clear();
    return 0;
}

int TrackCopier::write(ffmpeg::PacketPtr& packet) {
    const int err = muxer_.write(packet.get(), output_, source_->time_base);
    packet.reset();
    return err;
}

int TrackCopier::finish() {
    if (const int err = release(DecodeTimes::kNone); err < 0)
        return err;
    if (!held_)
        return 0;
    // The last sample ends at the end of the range, so the clip lasts
    // exactly as long as asked.
    AVPacket* last = held_.get();
    const std::int64_t end = cut_.editDuration;
    if (last->pts != AV_NOPTS_VALUE && last->pts < end && last->pts + last->duration > end)
        last->duration = end - last->pts;
    return write(held_);
}

} // namespace platform
