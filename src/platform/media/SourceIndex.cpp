#include "SourceIndex.h"

#include "FragmentIndex.h"
#include "StreamTime.h"

#include <algorithm>
#include <cstring>
#include <map>
#include <optional>

namespace platform {
namespace {

bool isTrack(const AVStream* stream) {
    const AVMediaType type = stream->codecpar->codec_type;
    return (type == AVMEDIA_TYPE_VIDEO || type == AVMEDIA_TYPE_AUDIO) &&
           !(stream->disposition & AV_DISPOSITION_ATTACHED_PIC);
}

// How much audio must be decoded before the first sample heard: one frame
// (the encoder's priming, 1024 samples of AAC).
std::int64_t prerollOf(const AVStream* stream) {
    const int frame = stream->codecpar->frame_size > 0 ? stream->codecpar->frame_size : 1024;
    const int rate = stream->codecpar->sample_rate > 0 ? stream->codecpar->sample_rate : 48000;
    return StreamTime::rescale(frame, AVRational{1, rate}, stream->time_base);
}

std::int64_t endOf(const AVFormatContext* input, const AVStream* stream) {
    const std::int64_t start = stream->start_time == AV_NOPTS_VALUE ? 0 : stream->start_time;
    std::int64_t length = stream->duration;
    if (length == AV_NOPTS_VALUE)
        length = StreamTime::rescale(input->duration, AV_TIME_BASE_Q, stream->time_base);
    return start + length;
}

// The first packets of each track: what the demuxer reports for the samples
// it starts with, so the index's times can be set beside its own.
struct FirstPackets {
    std::vector<std::pair<std::int64_t, std::int64_t>> posAndDts;
    std::optional<std::int64_t> keyframeDelay; // pts - dts of the first packet
};

std::map<int, FirstPackets> readFirstPackets(AVFormatContext* input) {
    std::map<int, FirstPackets> seen;
    ffmpeg::PacketPtr packet = ffmpeg::makePacket();
    for (int read = 0; read < 96 && av_read_frame(input, packet.get()) >= 0; ++read) {
        FirstPackets& first = seen[packet->stream_index];
        if (packet->dts != AV_NOPTS_VALUE && packet->pos >= 0 && first.posAndDts.size() < 8)
            first.posAndDts.emplace_back(packet->pos, packet->dts);
        if (!first.keyframeDelay && packet->pts != AV_NOPTS_VALUE && packet->dts != AV_NOPTS_VALUE)
            first.keyframeDelay = packet->pts - packet->dts;
        av_packet_unref(packet.get());
    }
    return seen;
}

} // namespace

const IndexedTrack* SourceIndex::track(int streamIndex) const {
    if (streamIndex < 0 || streamIndex >= int(tracks_.size()) || !tracks_[streamIndex].stream)
        return nullptr;
    return &tracks_[streamIndex];
}

IndexedTrack* SourceIndex::track(int streamIndex) {
    return const_cast<IndexedTrack*>(std::as_const(*this).track(streamIndex));
}

SourceIndex SourceIndex::scan(AVFormatContext* input, const QString& hostPath) {
    SourceIndex index;
    index.tracks_.resize(input->nb_streams);
    std::optional<FragmentIndex> fragments;
    if (std::strstr(input->iformat->name, "mp4"))
        fragments = FragmentIndex::read(hostPath);
    index.fragmented_ = fragments.has_value();
    if (fragments)
        index.completeBytes_ = fragments->completeBytes;
    const std::map<int, FirstPackets> first = readFirstPackets(input);

    for (unsigned i = 0; i < input->nb_streams; ++i) {
        AVStream* stream = input->streams[i];
        if (!isTrack(stream))
            continue;
        IndexedTrack& track = index.tracks_[i];
        track.stream = stream;
        const bool video = stream->codecpar->codec_type == AVMEDIA_TYPE_VIDEO;
        CutPlanner::TrackInfo& info = track.info;
        info.kind = video ? CutPlanner::TrackKind::Video : CutPlanner::TrackKind::Audio;
        info.end = endOf(input, stream);
        if (!video)
            info.preroll = prerollOf(stream);
        const auto seen = first.find(int(i));

        if (fragments) {
            const FragmentTrack* from = fragments->track(stream->id);
            if (!from || from->samples.empty())
                continue;
            // The fragments count from the track's first decode time; the
            // demuxer may shift that (an edit list). Its report of a sample
            // it read, found by position, says by how much.
            std::int64_t shift = 0;
            if (seen != first.end() && !seen->second.posAndDts.empty()) {
                const auto [pos, dts] = seen->second.posAndDts.front();
                for (const FragmentSample& s : from->samples)
                    if (s.pos == pos) {
                        const std::int64_t own = StreamTime::rescale(
                            s.dts, AVRational{1, from->timescale}, stream->time_base);
                        if (dts == AV_NOPTS_VALUE || own == AV_NOPTS_VALUE ||
                            __builtin_sub_overflow(dts, own, &shift))
                            shift = 0;
                        break;
                    }
            }
            track.reordered = from->reordered;
            track.samples.reserve(from->samples.size());
            std::int64_t end = INT64_MIN;
            for (const FragmentSample& s : from->samples) {
                const AVRational scale{1, from->timescale};
                IndexedSample sample;
                // A damaged fragment can give times that no stream time holds;
                // such a sample cannot be placed, so it is left out.
                const std::int64_t dts = StreamTime::rescale(s.dts, scale, stream->time_base);
                const std::int64_t pts = StreamTime::rescale(s.pts, scale, stream->time_base);
                sample.duration = StreamTime::rescale(s.duration, scale, stream->time_base);
                if (dts == AV_NOPTS_VALUE || pts == AV_NOPTS_VALUE ||
                    sample.duration == AV_NOPTS_VALUE ||
                    __builtin_add_overflow(dts, shift, &sample.dts) ||
                    __builtin_add_overflow(pts, shift, &sample.pts) ||
                    sample.pts > INT64_MAX - std::max<std::int64_t>(sample.duration, 0))
                    continue;
                sample.pos = s.pos;
                sample.size = s.size;
                sample.key = !video || s.key;
                end = std::max(end, sample.pts + sample.duration);
                if (sample.key)
                    info.syncSamples.push_back({sample.dts, sample.pts});
                track.samples.push_back(sample);
            }
            info.end = end;
            continue;
        }

        // The demuxer's index: decode times (MP4) or presentation times
        // (Matroska cues) of keyframes, with every sample for MP4.
        const bool mp4 = std::strstr(input->iformat->name, "mp4") != nullptr;
        const std::int64_t delay =
            video && mp4 && seen != first.end() ? seen->second.keyframeDelay.value_or(0) : 0;
        // Only reordered frames are shown later than they are decoded.
        track.reordered = delay != 0;
        const int entries = avformat_index_get_entries_count(stream);
        if (mp4)
            track.samples.reserve(entries);
        for (int e = 0; e < entries; ++e) {
            const AVIndexEntry* x = avformat_index_get_entry(stream, e);
            if (!x)
                continue;
            const bool key = !video || (x->flags & AVINDEX_KEYFRAME);
            if (key)
                info.syncSamples.push_back({x->timestamp, x->timestamp + delay});
            if (mp4)
                track.samples.push_back(
                    {x->timestamp, x->timestamp + delay, x->pos, x->size, 0, key});
        }
        for (size_t s = 0; s + 1 < track.samples.size(); ++s)
            track.samples[s].duration = track.samples[s + 1].dts - track.samples[s].dts;
        if (!track.samples.empty())
            track.samples.back().duration =
                std::max<std::int64_t>(1, info.end - track.samples.back().dts);
    }
    return index;
}

} // namespace platform
