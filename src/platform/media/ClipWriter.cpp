#include "ClipWriter.h"

#include "Mp4EditPatch.h"
#include "StreamTime.h"
#include "platform/runtime/Log.h"

#include <algorithm>

namespace platform {
namespace {

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
    ErrorPtr error;
    if ((error = open()) || (error = chooseRoutes()) || (error = makeTracks()) ||
        (error = seek()) || (error = copyRange()) || (error = finish()))
        return error;
    return nullptr;
}

ErrorPtr ClipWriter::open() {
    int err = 0;
    input_ = ffmpeg::openInput(job_.sourcePath, &err);
    if (!input_)
        return ffmpeg::failure(err, QStringLiteral("cannot open the source"));
    index_ = SourceIndex::scan(input_.get(), job_.sourcePath);
    // The clip's times count from the movie's first sample, as the player's do.
    const AVFormatContext* in = input_.get();
    const MediaTime movieStart = in->start_time == AV_NOPTS_VALUE
                                     ? MediaTime::zero()
                                     : StreamTime::toMediaTime(in->start_time, AV_TIME_BASE_Q);
    rangeStart_ = job_.range.start + movieStart;
    rangeEnd_ = job_.range.end() + movieStart;
    if (job_.audioMix)
        for (const AudioMixInputParameters& p : job_.audioMix->inputParameters)
            if (p.trackID >= 1 && p.trackID <= int(in->nb_streams) &&
                in->streams[p.trackID - 1]->codecpar->codec_type == AVMEDIA_TYPE_AUDIO)
                named_[p.trackID - 1] = p.volume;
    return nullptr;
}

// Plans each track's cut; the tracks with nothing in the range are left out.
ErrorPtr ClipWriter::chooseRoutes() {
    AVFormatContext* in = input_.get();
    routes_.resize(in->nb_streams);
    for (unsigned i = 0; i < in->nb_streams; ++i) {
        AVStream* stream = in->streams[i];
        const IndexedTrack* track = index_->track(int(i));
        stream->discard = AVDISCARD_ALL;
        if (!readable(stream) || !track)
            continue;
        Route& route = routes_[i];
        route.isVideo = stream->codecpar->codec_type == AVMEDIA_TYPE_VIDEO;
        route.cut = CutPlanner::planTrack(track->info,
                                          StreamTime::fromMediaTime(rangeStart_, stream->time_base),
                                          StreamTime::fromMediaTime(rangeEnd_, stream->time_base));
        if (route.cut.empty)
            continue;
        stream->discard = AVDISCARD_DEFAULT;
        if (named_.size() >= 2 && named_.count(int(i)))
            mixed_.push_back({stream, named_[int(i)]});
    }
    return nullptr;
}

// The clip's tracks, in the source's order: copied where the rule allows and
// the level stays, else encoded; the tracks to mix become one, where the
// first of them was.
ErrorPtr ClipWriter::makeTracks() {
    AVFormatContext* in = input_.get();
    ErrorPtr error;
    muxer_ = ClipMuxer::create(job_.outputPath, &error);
    if (!muxer_)
        return error;
    const EncodingSettings settings = encodingSettingsFor(job_.rule);
    AudioTranscoder* mixer = nullptr;
    for (unsigned i = 0; i < in->nb_streams; ++i) {
        AVStream* stream = in->streams[i];
        Route& route = routes_[i];
        if (stream->discard == AVDISCARD_ALL)
            continue;
        const auto volume = named_.find(int(i));
        const bool inMix = mixed_.size() >= 2 && volume != named_.end();
        if (inMix && mixer) {
            route.audio = mixer;
            continue;
        }
        const bool keepsLevel = volume == named_.end() || volume->second == 1.0f;
        if (!inMix && keepsLevel && copiesAsItIs(job_.rule, stream->codecpar->codec_id)) {
            auto copier = TrackCopier::create(stream, *muxer_);
            if (!copier)
                return ffmpeg::failure(AVERROR(ENOMEM),
                                       QStringLiteral("cannot make the output track"));
            copier->setCut(route.cut);
            route.copier = copier.get();
            outputs_.emplace_back(copier->output(), int(i));
            copiers_.push_back(std::move(copier));
        } else if (route.isVideo) {
            auto coder = VideoTranscoder::create(stream, *muxer_, settings, &error);
            if (!coder)
                return error;
            route.video = coder.get();
            outputs_.emplace_back(coder->output(), int(i));
            videoCoders_.push_back(std::move(coder));
        } else {
            const std::vector<AudioTranscoder::Input> inputs =
                inMix ? mixed_
                      : std::vector<AudioTranscoder::Input>{
                            {stream, keepsLevel ? 1.0f : volume->second}};
            auto coder = AudioTranscoder::create(inputs, *muxer_, settings, &error);
            if (!coder)
                return error;
            route.audio = coder.get();
            if (inMix)
                mixer = coder.get();
            outputs_.emplace_back(coder->output(), int(i));
            audioCoders_.push_back(std::move(coder));
        }
    }
    if (outputs_.empty())
        return makeError(AVERROR(EINVAL), mediaErrorDomain(),
                         QStringLiteral("the time range holds no samples"));
    for (unsigned i = 0; i < in->nb_streams && lead_ < 0; ++i)
        if (routes_[i].any() && routes_[i].isVideo)
            lead_ = int(i);
    if (lead_ >= 0)
        leadStart_ = StreamTime::fromMediaTime(rangeStart_, in->streams[lead_]->time_base);
    return muxer_->begin();
}

// Seeks by the track that must start reading earliest (audio primes before
// the video's keyframe); the demuxer puts the others at or before the same
// time.
ErrorPtr ClipWriter::seek() {
    AVFormatContext* in = input_.get();
    int seekStream = -1;
    std::int64_t seekFrom = INT64_MAX; // in AV_TIME_BASE
    for (unsigned i = 0; i < in->nb_streams; ++i) {
        if (!routes_[i].any())
            continue;
        const std::int64_t from =
            StreamTime::rescale(routes_[i].cut.firstDts, in->streams[i]->time_base, AV_TIME_BASE_Q);
        if (from < seekFrom) {
            seekFrom = from;
            seekStream = int(i);
        }
    }
    int err = av_seek_frame(in, seekStream, routes_[seekStream].cut.firstDts, AVSEEK_FLAG_BACKWARD);
    if (err < 0 && (err = avformat_seek_file(in, -1, INT64_MIN, seekFrom, seekFrom, 0)) < 0)
        return ffmpeg::failure(err, QStringLiteral("cannot seek in the source"));
    // Without video the clip starts where asked.
    return lead_ < 0 ? settle() : nullptr;
}

ErrorPtr ClipWriter::copyRange() {
    AVFormatContext* in = input_.get();
    const std::int64_t progressFrom = StreamTime::fromMediaTime(rangeStart_, AV_TIME_BASE_Q);
    const double progressSpan = std::max(
        1.0, double(StreamTime::fromMediaTime(rangeEnd_, AV_TIME_BASE_Q)) - double(progressFrom));
    ffmpeg::PacketPtr packet = ffmpeg::makePacket();
    while (!allDone()) {
        if (job_.isCancelled())
            return cancelled();
        const int err = av_read_frame(in, packet.get());
        if (err == AVERROR_EOF || (err < 0 && in->pb && avio_feof(in->pb)))
            break;
        if (err < 0)
            return ffmpeg::failure(err, QStringLiteral("cannot read the source"));
        // A recording cut short: what lies past its last complete fragment
        // was never completely written.
        if (packet->pos >= 0 && packet->pos + packet->size > index_->completeBytes()) {
            av_packet_unref(packet.get());
            break;
        }
        const int s = packet->stream_index;
        if (s < 0 || s >= int(routes_.size()) || !routes_[s].any()) {
            av_packet_unref(packet.get());
            continue;
        }
        if (s == lead_ && job_.progress && packet->dts != AV_NOPTS_VALUE) {
            // In floating point: a damaged file's times may be anywhere.
            const std::int64_t at =
                StreamTime::rescale(packet->dts, in->streams[s]->time_base, AV_TIME_BASE_Q);
            if (at != AV_NOPTS_VALUE)
                job_.progress(float((double(at) - double(progressFrom)) / progressSpan));
        }
        bool dispatchNow = settled_;
        if (!settled_)
            if (ErrorPtr e = takeBeforeStart(packet, &dispatchNow))
                return e;
        if (dispatchNow)
            if (ErrorPtr e = dispatch(packet.get()))
                return e;
    }
    return settled_ ? nullptr : settle();
}

ErrorPtr ClipWriter::takeBeforeStart(ffmpeg::PacketPtr& packet, bool* settledNow) {
    AVFormatContext* in = input_.get();
    *settledNow = false;
    auto keep = [&] {
        ffmpeg::PacketPtr kept = ffmpeg::makePacket();
        av_packet_move_ref(kept.get(), packet.get());
        waiting_.push_back(std::move(kept));
    };
    if (packet->stream_index != lead_) {
        keep();
        return nullptr;
    }
    const bool key = packet->flags & AV_PKT_FLAG_KEY;
    const std::int64_t pts = packet->pts, dts = packet->dts;
    const bool atOrBeforeStart = pts != AV_NOPTS_VALUE && pts <= leadStart_;
    if (key && atOrBeforeStart) {
        // A later keyframe still at or before the start: begin again from it
        // (and let go of audio long before it).
        const MediaTime keepFrom =
            StreamTime::toMediaTime(pts, in->streams[lead_]->time_base) - MediaTime::make(2, 1);
        std::erase_if(waiting_, [&](const ffmpeg::PacketPtr& p) {
            return p->stream_index == lead_ ||
                   (p->pts != AV_NOPTS_VALUE &&
                    StreamTime::toMediaTime(p->pts, in->streams[p->stream_index]->time_base) <
                        keepFrom);
        });
        leadStarted_ = true;
        shownAtStart_ = pts;
        keep();
        return nullptr;
    }
    if (!leadStarted_) {
        if (!key) {
            av_packet_unref(packet.get());
            return nullptr;
        }
        // The video begins after the requested start: so does the clip, with
        // its first picture.
        leadStarted_ = true;
        shownAtStart_ = pts;
        keep();
        return settle();
    }
    if ((dts != AV_NOPTS_VALUE && dts > leadStart_) ||
        (key && pts != AV_NOPTS_VALUE && pts > leadStart_)) {
        // Every frame shown at or before the start decodes before this one.
        *settledNow = true;
        return settle();
    }
    if (atOrBeforeStart)
        shownAtStart_ = std::max(shownAtStart_, pts);
    keep();
    return nullptr;
}

// The clip starts at the time of the frame the lead shows at the requested
// start; every track is cut there, and what waited goes on.
ErrorPtr ClipWriter::settle() {
    AVFormatContext* in = input_.get();
    settled_ = true;
    MediaTime clipStart = rangeStart_;
    if (shownAtStart_ != AV_NOPTS_VALUE)
        clipStart = StreamTime::toMediaTime(shownAtStart_, in->streams[lead_]->time_base);
    for (unsigned i = 0; i < in->nb_streams; ++i) {
        Route& route = routes_[i];
        const AVRational tb = in->streams[i]->time_base;
        route.cut = CutPlanner::startingAt(route.cut, StreamTime::fromMediaTime(clipStart, tb));
        if (route.copier)
            route.copier->setCut(route.cut);
        if (route.video)
            route.video->setRange(StreamTime::fromMediaTime(clipStart, tb),
                                  StreamTime::fromMediaTime(rangeEnd_, tb));
    }
    for (auto& coder : audioCoders_)
        coder->setRange(clipStart, rangeEnd_);
    // Each other track starts at its last sync sample (a keyframe; any audio
    // frame) early enough: at the clip's start, audio one frame before it so
    // the first sample heard decodes as in the source.
    std::vector<size_t> firstTaken(in->nb_streams, SIZE_MAX);
    for (size_t k = 0; k < waiting_.size(); ++k) {
        const AVPacket* p = waiting_[k].get();
        const int s = p->stream_index;
        if (s == lead_ || p->pts == AV_NOPTS_VALUE)
            continue;
        const bool sync = !routes_[s].isVideo || (p->flags & AV_PKT_FLAG_KEY);
        const std::int64_t threshold =
            StreamTime::fromMediaTime(clipStart, in->streams[s]->time_base) -
            (routes_[s].isVideo ? 0 : index_->track(s)->info.preroll);
        if (sync && (firstTaken[s] == SIZE_MAX || p->pts <= threshold))
            firstTaken[s] = k;
    }
    for (size_t k = 0; k < waiting_.size(); ++k) {
        const int s = waiting_[k]->stream_index;
        if (s != lead_ && (firstTaken[s] == SIZE_MAX || k < firstTaken[s]))
            continue;
        if (ErrorPtr e = dispatch(waiting_[k].get()))
            return e;
    }
    waiting_.clear();
    return nullptr;
}

ErrorPtr ClipWriter::dispatch(AVPacket* packet) {
    Route& route = routes_[packet->stream_index];
    if (route.copier) {
        if (const int e = route.copier->take(packet); e < 0)
            return ffmpeg::failure(e, QStringLiteral("cannot write a sample"));
        return nullptr;
    }
    if (route.video)
        return route.video->take(packet);
    if (route.audio)
        return route.audio->take(packet);
    av_packet_unref(packet);
    return nullptr;
}

bool ClipWriter::allDone() const {
    return std::all_of(copiers_.begin(), copiers_.end(), [](const auto& c) { return c->done(); }) &&
           std::all_of(videoCoders_.begin(), videoCoders_.end(),
                       [](const auto& v) { return v->done(); }) &&
           std::all_of(audioCoders_.begin(), audioCoders_.end(),
                       [](const auto& a) { return a->done(); });
}

ErrorPtr ClipWriter::finish() {
    for (auto& c : copiers_)
        if (const int e = c->finish(); e < 0)
            return ffmpeg::failure(e, QStringLiteral("cannot write a sample"));
    for (auto& v : videoCoders_)
        if (ErrorPtr e = v->finish())
            return e;
    for (auto& a : audioCoders_)
        if (ErrorPtr e = a->finish())
            return e;
    std::vector<MediaTime> lengths;
    for (const auto& [output, source] : outputs_)
        lengths.push_back(StreamTime::toMediaTime(routes_[source].cut.editDuration,
                                                  input_->streams[source]->time_base));
    if (ErrorPtr e = muxer_->finish())
        return e;
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

ErrorPtr runExport(const ExportJob& job) {
    // TAMSEL_EXPORT_REMUX=1 leaves the span copy out, to compare the paths.
    ErrorPtr spanError;
    if (qEnvironmentVariableIsEmpty("TAMSEL_EXPORT_REMUX") && trySpanCopyExport(job, &spanError))
        return spanError;
    return ClipWriter(job).run();
}

} // namespace platform
