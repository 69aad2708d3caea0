#include "SourceEnds.h"

#include "FFmpegHandles.h"
#include "FragmentIndex.h"
#include "StreamTime.h"

#include <QFile>
#include <QFileInfo>

#include <algorithm>
#include <cstring>
#include <vector>

namespace platform {
namespace {

// Sets each stream's duration from its presentation end (in its time base)
// and the input's from the latest.
void applyEnds(AVFormatContext* input, const std::vector<std::int64_t>& ends) {
    std::int64_t last = AV_NOPTS_VALUE;
    for (unsigned i = 0; i < input->nb_streams; ++i) {
        AVStream* stream = input->streams[i];
        if (ends[i] == AV_NOPTS_VALUE)
            continue;
        const std::int64_t start = stream->start_time == AV_NOPTS_VALUE ? 0 : stream->start_time;
        stream->duration = std::max<std::int64_t>(0, ends[i] - start);
        const std::int64_t end = StreamTime::rescale(ends[i], stream->time_base, AV_TIME_BASE_Q);
        last = last == AV_NOPTS_VALUE ? end : std::max(last, end);
    }
    if (last != AV_NOPTS_VALUE)
        input->duration = last - (input->start_time == AV_NOPTS_VALUE ? 0 : input->start_time);
}

void settleFragments(AVFormatContext* input, const QString& hostPath) {
    const std::optional<FragmentIndex> index = FragmentIndex::read(hostPath);
    if (!index)
        return;
    std::vector<std::int64_t> ends(input->nb_streams, AV_NOPTS_VALUE);
    for (unsigned i = 0; i < input->nb_streams; ++i) {
        AVStream* stream = input->streams[i];
        const FragmentTrack* track = index->track(stream->id);
        if (!track || track->samples.empty() || track->timescale <= 0)
            continue;
        // The track's length from its samples, laid where the demuxer starts
        // the stream.
        std::int64_t first = INT64_MAX, end = INT64_MIN;
        for (const FragmentSample& s : track->samples) {
            first = std::min(first, s.pts);
            end = std::max(end, s.pts + s.duration);
        }
        const AVRational scale{1, track->timescale};
        const std::int64_t start = stream->start_time == AV_NOPTS_VALUE ? 0 : stream->start_time;
        ends[i] = start + StreamTime::rescale(end - first, scale, stream->time_base);
    }
    applyEnds(input, ends);
}

// Reads the last part of the file (a second reader, from a byte position)
// for the end of each stream's last complete packet. Reads at most the last
// 64 MB: opening must stay quick; a file with no packet there keeps what its
// headers said.
void settleFromTail(AVFormatContext* input, const QString& hostPath) {
    const qint64 size = QFileInfo(hostPath).size();
    for (qint64 window = 4 << 20; window <= (64 << 20); window *= 4) {
        int err = 0;
        ffmpeg::InputPtr tail = ffmpeg::openInputAsIs(hostPath, &err);
        if (!tail || tail->nb_streams != input->nb_streams)
            return;
        const qint64 from = std::max<qint64>(0, size - window);
        if (from > 0 && av_seek_frame(tail.get(), -1, from, AVSEEK_FLAG_BYTE) < 0)
            return;
        std::vector<std::int64_t> ends(input->nb_streams, AV_NOPTS_VALUE);
        bool any = false;
        ffmpeg::PacketPtr packet = ffmpeg::makePacket();
        while (av_read_frame(tail.get(), packet.get()) >= 0) {
            const int s = packet->stream_index;
            const std::int64_t pts = packet->pts != AV_NOPTS_VALUE ? packet->pts : packet->dts;
            if (s >= 0 && s < int(ends.size()) && pts != AV_NOPTS_VALUE) {
                const std::int64_t end = pts + std::max<std::int64_t>(0, packet->duration);
                ends[s] = ends[s] == AV_NOPTS_VALUE ? end : std::max(ends[s], end);
                any = true;
            }
            av_packet_unref(packet.get());
        }
        if (any || from == 0) {
            applyEnds(input, ends);
            return;
        }
    }
}

} // namespace

void settleEnds(AVFormatContext* input, const QString& hostPath) {
    const char* name = input->iformat->name;
    if (std::strstr(name, "mp4")) {
        settleFragments(input, hostPath);
    } else if (std::strstr(name, "matroska")) {
        // Matroska states no stream lengths, its segment's duration (when
        // there is one: not in a file written live) counts from timestamp 0
        // whatever the first is, and it is rounded: the last blocks say.
        settleFromTail(input, hostPath);
    }
}

} // namespace platform
