// The pass-through export: the samples of the range are copied as they are.
// The clip starts at the keyframe before the requested start (and, for audio,
// one frame of priming earlier); timestamps are shifted so the requested
// start is 0, and the mov muxer turns the negative lead into an edit list, so
// players start exactly at the requested frame with the audio in step.
// Sources whose samples can be copied as one span of the file go the faster
// way of SpanCopyExport.cpp; this remuxer handles the rest (reordered frames,
// other containers, complex edit lists).

#include "CutPlanner.h"
#include "ExportJob.h"
#include "FFmpegError.h"
#include "FFmpegHandles.h"
#include "Mp4EditPatch.h"
#include "StreamTime.h"
#include "platform/runtime/Log.h"

#include <QFile>

#include <vector>

namespace platform {
namespace {

struct CopiedTrack {
    AVStream* in = nullptr;
    AVStream* out = nullptr;
    CutPlanner::TrackCut cut;
    bool started = false;
    bool done = false;
    ffmpeg::PacketPtr held; // written when the next one comes, so the last can be trimmed
};

using ffmpeg::failure;

// Presentation delay of the video's keyframes (pts - dts), learnt from the
// first video packet; the index only has decode times.
std::int64_t keyframeDelay(AVFormatContext* in, int videoIndex) {
    ffmpeg::PacketPtr packet = ffmpeg::makePacket();
    for (int read = 0; read < 64 && av_read_frame(in, packet.get()) >= 0; ++read) {
        const bool found = packet->stream_index == videoIndex;
        const std::int64_t delay =
            found && packet->pts != AV_NOPTS_VALUE && packet->dts != AV_NOPTS_VALUE
                ? packet->pts - packet->dts
                : 0;
        av_packet_unref(packet.get());
        if (found)
            return delay;
    }
    return 0;
}

CutPlanner::TrackInfo trackInfo(const AVFormatContext* in, AVStream* stream,
                                std::int64_t videoDelay) {
    CutPlanner::TrackInfo info;
    const bool video = stream->codecpar->codec_type == AVMEDIA_TYPE_VIDEO;
    info.kind = video ? CutPlanner::TrackKind::Video : CutPlanner::TrackKind::Audio;
    const int entries = avformat_index_get_entries_count(stream);
    info.syncSamples.reserve(video ? entries / 16 + 1 : entries);
    for (int i = 0; i < entries; ++i) {
        const AVIndexEntry* e = avformat_index_get_entry(stream, i);
        if (!e || (video && !(e->flags & AVINDEX_KEYFRAME)))
            continue;
        info.syncSamples.push_back({e->timestamp, e->timestamp + (video ? videoDelay : 0)});
    }
    const std::int64_t start = stream->start_time == AV_NOPTS_VALUE ? 0 : stream->start_time;
    std::int64_t length = stream->duration;
    if (length == AV_NOPTS_VALUE)
        length = StreamTime::rescale(in->duration, AV_TIME_BASE_Q, stream->time_base);
    info.end = start + length;
    if (!video) {
        const int frame = stream->codecpar->frame_size > 0 ? stream->codecpar->frame_size : 1024;
        const int rate = stream->codecpar->sample_rate > 0 ? stream->codecpar->sample_rate : 48000;
        info.preroll = StreamTime::rescale(frame, AVRational{1, rate}, stream->time_base);
    }
    return info;
}

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

ErrorPtr runPassthroughExport(const ExportJob& job) {
    // TAMSEL_EXPORT_REMUX=1 forces the remuxer, to compare the two paths.
    ErrorPtr spanError;
    if (qEnvironmentVariableIsEmpty("TAMSEL_EXPORT_REMUX") && trySpanCopyExport(job, &spanError))
        return spanError;
    int err = 0;
    ffmpeg::InputPtr input = ffmpeg::openInput(job.sourcePath, &err);
    if (!input)
        return failure(err, QStringLiteral("cannot open the source"));
    AVFormatContext* in = input.get();
    const int videoIndex = av_find_best_stream(in, AVMEDIA_TYPE_VIDEO, -1, -1, nullptr, 0);
    const std::int64_t delay = videoIndex >= 0 ? keyframeDelay(in, videoIndex) : 0;

    AVFormatContext* rawOut = nullptr;
    const QByteArray outName = QFile::encodeName(job.outputPath);
    err = avformat_alloc_output_context2(&rawOut, nullptr, "mp4", outName.constData());
    if (err < 0 || !rawOut)
        return failure(err, QStringLiteral("cannot make the output"));
    ffmpeg::OutputPtr output(rawOut);

    std::vector<CopiedTrack> tracks(in->nb_streams);
    int copied = 0;
    std::int64_t seekTo = INT64_MAX; // in AV_TIME_BASE
    int seekTrack = -1;              // the track that starts earliest
    for (unsigned i = 0; i < in->nb_streams; ++i) {
        AVStream* stream = in->streams[i];
        const AVMediaType type = stream->codecpar->codec_type;
        if ((type != AVMEDIA_TYPE_VIDEO && type != AVMEDIA_TYPE_AUDIO) ||
            (stream->disposition & AV_DISPOSITION_ATTACHED_PIC)) {
            stream->discard = AVDISCARD_ALL;
            continue;
        }
        const std::int64_t start = StreamTime::fromMediaTime(job.range.start, stream->time_base);
        const std::int64_t end = StreamTime::fromMediaTime(job.range.end(), stream->time_base);
        CopiedTrack& track = tracks[i];
        track.in = stream;
        track.cut = CutPlanner::planTrack(trackInfo(in, stream, delay), start, end);
        if (track.cut.empty) {
            stream->discard = AVDISCARD_ALL;
            continue;
        }
        track.out = avformat_new_stream(output.get(), nullptr);
        if (!track.out || avcodec_parameters_copy(track.out->codecpar, stream->codecpar) < 0 ||
            !copyDisplayMatrix(stream, track.out))
            return failure(AVERROR(ENOMEM), QStringLiteral("cannot make the output track"));
        track.out->codecpar->codec_tag = 0;
        track.out->time_base = stream->time_base;
        track.out->disposition = stream->disposition;
        track.out->avg_frame_rate = stream->avg_frame_rate;
        const std::int64_t from =
            StreamTime::rescale(track.cut.firstDts, stream->time_base, AV_TIME_BASE_Q);
        if (from < seekTo) {
            seekTo = from;
            seekTrack = int(i);
        }
        ++copied;
    }
    if (copied == 0)
        return makeError(AVERROR(EINVAL), mediaErrorDomain(),
                         QStringLiteral("the time range holds no samples"));

    if ((err = avio_open(&output->pb, outName.constData(), AVIO_FLAG_WRITE)) < 0)
        return failure(err, QStringLiteral("cannot write the output"));
    if ((err = avformat_write_header(output.get(), nullptr)) < 0)
        return failure(err, QStringLiteral("cannot write the output header"));

    // Seek by the track that starts earliest (audio priming may lie before
    // the video's keyframe); the demuxer puts the others at or before the
    // same time.
    const std::int64_t seekTrackFrom = tracks[seekTrack].cut.firstDts;
    if ((err = av_seek_frame(in, seekTrack, seekTrackFrom, AVSEEK_FLAG_BACKWARD)) < 0 &&
        (err = avformat_seek_file(in, seekTrack, INT64_MIN, seekTrackFrom, seekTrackFrom, 0)) < 0)
        return failure(err, QStringLiteral("cannot seek in the source"));

    auto write = [&](CopiedTrack& track, ffmpeg::PacketPtr& packet) {
        // The muxer may have chosen its own time base for the track.
        const AVRational from = track.in->time_base, to = track.out->time_base;
        packet->pts = StreamTime::rescale(packet->pts, from, to);
        packet->dts = StreamTime::rescale(packet->dts, from, to);
        packet->duration = StreamTime::rescale(packet->duration, from, to);
        // The muxer takes the packet's payload; the packet is blank after.
        return av_interleaved_write_frame(output.get(), packet.get());
    };

    // Emits one packet of a track whose start is settled: shifted so the
    // start is 0, held back by one so the last can be trimmed.
    auto forward = [&](CopiedTrack& track, ffmpeg::PacketPtr& packet) -> int {
        packet->pts =
            packet->pts == AV_NOPTS_VALUE ? AV_NOPTS_VALUE : packet->pts - track.cut.offset;
        packet->dts -= track.cut.offset;
        packet->flags &= ~AV_PKT_FLAG_DISCARD;
        packet->stream_index = track.out->index;
        packet->pos = -1;
        int result = 0;
        if (track.held)
            result = write(track, track.held);
        else
            track.held = ffmpeg::makePacket();
        av_packet_move_ref(track.held.get(), packet.get());
        return result;
    };

    // Until the video's frames up to the requested start have been seen, the
    // packets wait here (at most a keyframe interval): the clip then starts
    // at the presentation time of the frame shown at the requested start.
    CopiedTrack* video = videoIndex >= 0 && tracks[videoIndex].out ? &tracks[videoIndex] : nullptr;
    bool settled = !video;
    std::int64_t shownAtStart = AV_NOPTS_VALUE;
    std::vector<std::pair<int, ffmpeg::PacketPtr>> waiting;
    auto settle = [&]() -> int {
        settled = true;
        if (shownAtStart != AV_NOPTS_VALUE) {
            const MediaTime start = StreamTime::toMediaTime(shownAtStart, video->in->time_base);
            for (CopiedTrack& track : tracks)
                if (track.out)
                    track.cut = CutPlanner::startingAt(
                        track.cut, StreamTime::fromMediaTime(start, track.in->time_base));
        }
        for (auto& [index, packet] : waiting)
            if (const int result = forward(tracks[index], packet); result < 0)
                return result;
        waiting.clear();
        return 0;
    };

    const std::int64_t progressFrom = seekTo;
    const std::int64_t progressSpan = std::max<std::int64_t>(
        1, StreamTime::fromMediaTime(job.range.end(), AV_TIME_BASE_Q) - progressFrom);
    ffmpeg::PacketPtr packet = ffmpeg::makePacket();
    int open = copied;
    while (open > 0) {
        if (job.isCancelled())
            return makeError(kExportCancelledCode, mediaErrorDomain(), QStringLiteral("cancelled"));
        err = av_read_frame(in, packet.get());
        if (err == AVERROR_EOF)
            break;
        if (err < 0)
            return failure(err, QStringLiteral("cannot read the source"));
        CopiedTrack& track = tracks[packet->stream_index];
        if (!track.out || track.done || packet->dts == AV_NOPTS_VALUE) {
            av_packet_unref(packet.get());
            continue;
        }
        const bool isVideo = &track == video;
        if (!track.started &&
            (packet->dts < track.cut.firstDts || (isVideo && !(packet->flags & AV_PKT_FLAG_KEY)))) {
            av_packet_unref(packet.get());
            continue;
        }
        const std::int64_t reached =
            isVideo || packet->pts == AV_NOPTS_VALUE ? packet->dts : packet->pts;
        if (reached >= track.cut.stopAt) {
            track.done = true;
            --open;
            av_packet_unref(packet.get());
            if (isVideo && !settled && (err = settle()) < 0)
                return failure(err, QStringLiteral("cannot write a sample"));
            continue;
        }
        track.started = true;
        if (job.progress && isVideo)
            job.progress(
                float(StreamTime::rescale(packet->dts, track.in->time_base, AV_TIME_BASE_Q) -
                      progressFrom) /
                float(progressSpan));
        if (!settled) {
            if (isVideo && packet->dts > track.cut.offset) {
                // Every frame shown at or before the start decodes before this one.
                if ((err = settle()) < 0)
                    return failure(err, QStringLiteral("cannot write a sample"));
            } else {
                if (isVideo && packet->pts != AV_NOPTS_VALUE && packet->pts <= track.cut.offset)
                    shownAtStart = std::max(
                        shownAtStart == AV_NOPTS_VALUE ? packet->pts : shownAtStart, packet->pts);
                ffmpeg::PacketPtr kept = ffmpeg::makePacket();
                av_packet_move_ref(kept.get(), packet.get());
                waiting.emplace_back(kept->stream_index, std::move(kept));
                continue;
            }
        }
        if ((err = forward(track, packet)) < 0)
            return failure(err, QStringLiteral("cannot write a sample"));
    }
    if (!settled && (err = settle()) < 0)
        return failure(err, QStringLiteral("cannot write a sample"));

    for (CopiedTrack& track : tracks) {
        if (!track.held)
            continue;
        AVPacket* last = track.held.get();
        // The last sample ends at the end of the range, so the clip lasts
        // exactly as long as asked.
        const std::int64_t end = track.cut.editDuration;
        if (last->pts != AV_NOPTS_VALUE && last->pts < end && last->pts + last->duration > end)
            last->duration = end - last->pts;
        if ((err = write(track, track.held)) < 0)
            return failure(err, QStringLiteral("cannot write a sample"));
    }
    if ((err = av_write_trailer(output.get())) < 0)
        return failure(err, QStringLiteral("cannot finish the output"));
    output.reset();
    // Reordered video may have needed samples shown after the end; the edit
    // list is cut to the range so that players stop where asked.
    std::vector<MediaTime> durations;
    for (const CopiedTrack& track : tracks)
        if (track.out)
            durations.push_back(
                StreamTime::toMediaTime(track.cut.editDuration, track.in->time_base));
    QString patchError;
    if (!shortenEdits(job.outputPath, durations, &patchError))
        logError(
            QStringLiteral("ExportSession: cannot trim the clip's edit list: %1").arg(patchError));
    if (job.progress)
        job.progress(1.0f);
    return nullptr;
}

} // namespace platform
