#include "ClipWriter.h"

#include "AudioTranscoder.h"
#include "ClipMuxer.h"
#include "Mp4EditPatch.h"
#include "SourceIndex.h"
#include "StreamTime.h"
#include "TrackCopier.h"
#include "VideoTranscoder.h"
#include "platform/runtime/Log.h"

#include <algorithm>
#include <map>

namespace platform {
namespace {

// What becomes of one source stream.
struct Route {
    TrackCopier* copier = nullptr;
    VideoTranscoder* video = nullptr;
    AudioTranscoder* audio = nullptr;
    CutPlanner::TrackCut cut;
    bool isVideo = false;

    bool any() const { return copier || video || audio; }
};

bool readable(const AVStream* stream) {
    const AVMediaType type = stream->codecpar->codec_type;
    return (type == AVMEDIA_TYPE_VIDEO || type == AVMEDIA_TYPE_AUDIO) &&
           !(stream->disposition & AV_DISPOSITION_ATTACHED_PIC);
}

ErrorPtr cancelled() {
    return makeError(kExportCancelledCode, mediaErrorDomain(), QStringLiteral("cancelled"));
}

} // namespace

ErrorPtr ClipWriter::run() {
    int err = 0;
    ffmpeg::InputPtr input = ffmpeg::openInput(job_.sourcePath, &err);
    if (!input)
        return mediaFailure(err, QStringLiteral("cannot open the source"));
    AVFormatContext* in = input.get();
    SourceIndex index = SourceIndex::scan(in, job_.sourcePath);
    // The clip's times count from the movie's first sample, as the player's do.
    const MediaTime movieStart = in->start_time == AV_NOPTS_VALUE
                                     ? MediaTime::zero()
                                     : StreamTime::toMediaTime(in->start_time, AV_TIME_BASE_Q);
    const MediaTime rangeStart = job_.range.start + movieStart;
    const MediaTime rangeEnd = job_.range.end() + movieStart;

    // Which tracks the audio mix names, at what volume.
    std::map<int, float> named;
    if (job_.audioMix)
        for (const AudioMixInputParameters& p : job_.audioMix->inputParameters)
            if (p.trackID >= 1 && p.trackID <= int(in->nb_streams) &&
                in->streams[p.trackID - 1]->codecpar->codec_type == AVMEDIA_TYPE_AUDIO)
                named[p.trackID - 1] = p.volume;

    std::vector<Route> routes(in->nb_streams);
    std::vector<AudioTranscoder::Input> mixed;
    for (unsigned i = 0; i < in->nb_streams; ++i) {
        AVStream* stream = in->streams[i];
        const IndexedTrack* track = index.track(int(i));
        stream->discard = AVDISCARD_ALL;
        if (!readable(stream) || !track)
            continue;
        Route& route = routes[i];
        route.isVideo = stream->codecpar->codec_type == AVMEDIA_TYPE_VIDEO;
        route.cut = CutPlanner::planTrack(track->info,
                                          StreamTime::fromMediaTime(rangeStart, stream->time_base),
                                          StreamTime::fromMediaTime(rangeEnd, stream->time_base));
        if (route.cut.empty)
            continue;
        stream->discard = AVDISCARD_DEFAULT;
        if (named.size() >= 2 && named.count(int(i)))
            mixed.push_back({stream, named[int(i)]});
    }

    ErrorPtr error;
    std::unique_ptr<ClipMuxer> muxer = ClipMuxer::create(job_.outputPath, &error);
    if (!muxer)
        return error;
    const EncodingSettings settings = encodingSettingsFor(job_.rule);
    std::vector<std::unique_ptr<TrackCopier>> copiers;
    std::vector<std::unique_ptr<VideoTranscoder>> videoCoders;
    std::vector<std::unique_ptr<AudioTranscoder>> audioCoders;
    std::vector<AVStream*> outputs; // in the clip's order, for the edit lists
    std::vector<MediaTime> lengths;
    AudioTranscoder* mixer = nullptr;
    for (unsigned i = 0; i < in->nb_streams; ++i) {
        AVStream* stream = in->streams[i];
        Route& route = routes[i];
        if (stream->discard == AVDISCARD_ALL)
            continue;
        const auto volume = named.find(int(i));
        const bool inMix = mixed.size() >= 2 && volume != named.end();
        if (inMix && mixer) {
            route.audio = mixer;
            continue;
        }
        const bool keepsLevel = volume == named.end() || volume->second == 1.0f;
        if (!inMix && keepsLevel && copiesAsItIs(job_.rule, stream->codecpar->codec_id)) {
            auto copier = TrackCopier::create(stream, *muxer);
            if (!copier)
                return mediaFailure(AVERROR(ENOMEM),
                                    QStringLiteral("cannot make the output track"));
            copier->setCut(route.cut);
            route.copier = copier.get();
            outputs.push_back(copier->output());
            copiers.push_back(std::move(copier));
        } else if (route.isVideo) {
            auto coder = VideoTranscoder::create(stream, *muxer, settings, &error);
            if (!coder)
                return error;
            route.video = coder.get();
            outputs.push_back(coder->output());
            videoCoders.push_back(std::move(coder));
        } else {
            std::vector<AudioTranscoder::Input> inputs =
                inMix ? mixed
                      : std::vector<AudioTranscoder::Input>{
                            {stream, keepsLevel ? 1.0f : volume->second}};
            auto coder = AudioTranscoder::create(inputs, *muxer, settings, &error);
            if (!coder)
                return error;
            route.audio = coder.get();
            if (inMix)
                mixer = coder.get();
            outputs.push_back(coder->output());
            audioCoders.push_back(std::move(coder));
        }
    }
    if (outputs.empty())
        return makeError(AVERROR(EINVAL), mediaErrorDomain(),
                         QStringLiteral("the time range holds no samples"));
    if ((error = muxer->begin()))
        return error;

    // The first video track leads: the clip starts with the frame it shows at
    // the requested start.
    int lead = -1;
    for (unsigned i = 0; i < in->nb_streams && lead < 0; ++i)
        if (routes[i].any() && routes[i].isVideo)
            lead = int(i);
    // Seek by the track that must start reading earliest (audio primes
    // before the video's keyframe); the demuxer puts the others at or before
    // the same time.
    int seekStream = -1;
    std::int64_t seekFrom = INT64_MAX; // in AV_TIME_BASE
    for (unsigned i = 0; i < in->nb_streams; ++i) {
        if (!routes[i].any())
            continue;
        const std::int64_t from =
            StreamTime::rescale(routes[i].cut.firstDts, in->streams[i]->time_base, AV_TIME_BASE_Q);
        if (from < seekFrom) {
            seekFrom = from;
            seekStream = int(i);
        }
    }
    const std::int64_t seekTo = routes[seekStream].cut.firstDts;
    if ((err = av_seek_frame(in, seekStream, seekTo, AVSEEK_FLAG_BACKWARD)) < 0 &&
        (err = avformat_seek_file(in, -1, INT64_MIN, seekFrom, seekFrom, 0)) < 0)
        return mediaFailure(err, QStringLiteral("cannot seek in the source"));

    auto dispatch = [&](AVPacket* packet) -> ErrorPtr {
        Route& route = routes[packet->stream_index];
        if (route.copier) {
            if (const int e = route.copier->take(packet); e < 0)
                return mediaFailure(e, QStringLiteral("cannot write a sample"));
            return nullptr;
        }
        if (route.video)
            return route.video->take(packet);
        if (route.audio)
            return route.audio->take(packet);
        av_packet_unref(packet);
        return nullptr;
    };
    auto allDone = [&] {
        for (const auto& c : copiers)
            if (!c->done())
                return false;
        for (const auto& v : videoCoders)
            if (!v->done())
                return false;
        for (const auto& a : audioCoders)
            if (!a->done())
                return false;
        return true;
    };

    // Until the lead has shown the frame at the requested start, packets wait
    // here, from the last keyframe at or before the start: the clip then
    // starts at that frame's time, whatever the index said.
    std::vector<ffmpeg::PacketPtr> waiting;
    bool settled = lead < 0;
    bool leadStarted = false;
    std::int64_t shownAtStart = AV_NOPTS_VALUE;
    const std::int64_t leadStart =
        lead < 0 ? 0 : StreamTime::fromMediaTime(rangeStart, in->streams[lead]->time_base);
    auto settle = [&]() -> ErrorPtr {
        settled = true;
        MediaTime clipStart = rangeStart;
        if (shownAtStart != AV_NOPTS_VALUE)
            clipStart = StreamTime::toMediaTime(shownAtStart, in->streams[lead]->time_base);
        for (unsigned i = 0; i < in->nb_streams; ++i) {
            Route& route = routes[i];
            const AVRational tb = in->streams[i]->time_base;
            route.cut = CutPlanner::startingAt(route.cut, StreamTime::fromMediaTime(clipStart, tb));
            if (route.copier)
                route.copier->setCut(route.cut);
            if (route.video)
                route.video->setRange(StreamTime::fromMediaTime(clipStart, tb),
                                      StreamTime::fromMediaTime(rangeEnd, tb));
        }
        for (auto& coder : audioCoders)
            coder->setRange(clipStart, rangeEnd);
        // Each other track starts at its last sync sample (a keyframe; any
        // audio frame) early enough: at the clip's start, audio one frame
        // before it so the first sample heard decodes as in the source.
        std::vector<size_t> firstTaken(in->nb_streams, SIZE_MAX);
        for (size_t k = 0; k < waiting.size(); ++k) {
            const AVPacket* p = waiting[k].get();
            const int s = p->stream_index;
            if (s == lead || p->pts == AV_NOPTS_VALUE)
                continue;
            const bool sync = !routes[s].isVideo || (p->flags & AV_PKT_FLAG_KEY);
            const AVRational tb = in->streams[s]->time_base;
            const std::int64_t threshold = StreamTime::fromMediaTime(clipStart, tb) -
                                           (routes[s].isVideo ? 0 : index.track(s)->info.preroll);
            if (sync && (firstTaken[s] == SIZE_MAX || p->pts <= threshold))
                firstTaken[s] = k;
        }
        for (size_t k = 0; k < waiting.size(); ++k) {
            AVPacket* p = waiting[k].get();
            const int s = p->stream_index;
            if (s != lead && (firstTaken[s] == SIZE_MAX || k < firstTaken[s]))
                continue;
            if (ErrorPtr e = dispatch(p))
                return e;
        }
        waiting.clear();
        return nullptr;
    };

    const std::int64_t progressFrom = StreamTime::fromMediaTime(rangeStart, AV_TIME_BASE_Q);
    const std::int64_t progressSpan = std::max<std::int64_t>(
        1, StreamTime::fromMediaTime(rangeEnd, AV_TIME_BASE_Q) - progressFrom);
    ffmpeg::PacketPtr packet = ffmpeg::makePacket();
    while (!allDone()) {
        if (job_.isCancelled())
            return cancelled();
        err = av_read_frame(in, packet.get());
        if (err == AVERROR_EOF || (err < 0 && in->pb && avio_feof(in->pb)))
            break;
        if (err < 0)
            return mediaFailure(err, QStringLiteral("cannot read the source"));
        // A recording cut short: what lies past its last complete fragment
        // was never completely written.
        if (packet->pos >= 0 && packet->pos + packet->size > index.completeBytes()) {
            av_packet_unref(packet.get());
            break;
        }
        const int s = packet->stream_index;
        if (s < 0 || s >= int(routes.size()) || !routes[s].any()) {
            av_packet_unref(packet.get());
            continue;
        }
        if (s == lead && job_.progress && packet->dts != AV_NOPTS_VALUE)
            job_.progress(
                float(StreamTime::rescale(packet->dts, in->streams[s]->time_base, AV_TIME_BASE_Q) -
                      progressFrom) /
                float(progressSpan));
        if (!settled && s == lead) {
            const bool key = packet->flags & AV_PKT_FLAG_KEY;
            const std::int64_t pts = packet->pts, dts = packet->dts;
            const bool atOrBeforeStart = pts != AV_NOPTS_VALUE && pts <= leadStart;
            bool settleNow = false;
            if (key && atOrBeforeStart) {
                // A later keyframe still at or before the start: begin again
                // from it (and let go of audio long before it).
                const MediaTime keepFrom =
                    StreamTime::toMediaTime(pts, in->streams[lead]->time_base) -
                    MediaTime::make(2, 1);
                std::erase_if(waiting, [&](const ffmpeg::PacketPtr& p) {
                    return p->stream_index == lead ||
                           (p->pts != AV_NOPTS_VALUE &&
                            StreamTime::toMediaTime(
                                p->pts, in->streams[p->stream_index]->time_base) < keepFrom);
                });
                leadStarted = true;
                shownAtStart = pts;
            } else if (!leadStarted) {
                if (!key) {
                    av_packet_unref(packet.get());
                    continue;
                }
                // The video begins after the requested start: so does the
                // clip, with its first picture.
                leadStarted = true;
                shownAtStart = pts;
                settleNow = true;
            } else if ((dts != AV_NOPTS_VALUE && dts > leadStart) ||
                       (key && pts != AV_NOPTS_VALUE && pts > leadStart)) {
                // Every frame shown at or before the start decodes before
                // this one.
                if ((error = settle()))
                    return error;
            } else if (atOrBeforeStart) {
                shownAtStart = std::max(shownAtStart, pts);
            }
            if (!settled) {
                ffmpeg::PacketPtr kept = ffmpeg::makePacket();
                av_packet_move_ref(kept.get(), packet.get());
                waiting.push_back(std::move(kept));
                if (settleNow && (error = settle()))
                    return error;
                continue;
            }
        } else if (!settled) {
            ffmpeg::PacketPtr kept = ffmpeg::makePacket();
            av_packet_move_ref(kept.get(), packet.get());
            waiting.push_back(std::move(kept));
            continue;
        }
        if ((error = dispatch(packet.get())))
            return error;
    }
    if (!settled && (error = settle()))
        return error;

    for (auto& c : copiers)
        if (const int e = c->finish(); e < 0)
            return mediaFailure(e, QStringLiteral("cannot write a sample"));
    for (auto& v : videoCoders)
        if ((error = v->finish()))
            return error;
    for (auto& a : audioCoders)
        if ((error = a->finish()))
            return error;
    for (AVStream* out : outputs) {
        for (unsigned i = 0; i < in->nb_streams; ++i) {
            const Route& route = routes[i];
            const bool mine = (route.copier && route.copier->output() == out) ||
                              (route.video && route.video->output() == out) ||
                              (route.audio && route.audio->output() == out);
            if (mine) {
                lengths.push_back(
                    StreamTime::toMediaTime(route.cut.editDuration, in->streams[i]->time_base));
                break;
            }
        }
    }
    if ((error = muxer->finish()))
        return error;
    // Reordered video may have needed samples shown after the end; the edit
    // lists are cut to the range so that players stop where asked.
    QString patchError;
    if (!shortenEdits(job_.outputPath, lengths, &patchError))
        logError(
            QStringLiteral("ExportSession: cannot trim the clip's edit list: %1").arg(patchError));
    if (job_.progress)
        job_.progress(1.0f);
    return nullptr;
}

} // namespace platform

namespace platform {

ErrorPtr runExport(const ExportJob& job) {
    // TAMSEL_EXPORT_REMUX=1 leaves the span copy out, to compare the paths.
    ErrorPtr spanError;
    if (qEnvironmentVariableIsEmpty("TAMSEL_EXPORT_REMUX") && trySpanCopyExport(job, &spanError))
        return spanError;
    return ClipWriter(job).run();
}

} // namespace platform
