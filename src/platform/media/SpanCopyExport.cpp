// The fast pass-through: when the source is an MP4 whose tracks show their
// samples in decode order, the samples of the range lie in one span of the
// source file. The clip is then the source's own sample descriptions and
// track headers with new sample tables, and the span copied inside the kernel
// (copy_file_range), never passing through this process.

#include "CutPlanner.h"
#include "ExportJob.h"
#include "FFmpegError.h"
#include "FFmpegHandles.h"
#include "Mp4Box.h"
#include "SourceIndex.h"
#include "StreamTime.h"

#include <QFile>

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <vector>

namespace platform {
namespace {

using mp4::Box;

using Sample = IndexedSample;

struct SpanTrack {
    AVStream* stream = nullptr;
    QByteArray trak; // the source's track box
    CutPlanner::TrackCut cut;
    std::vector<Sample> samples; // the ones copied, in order
    bool syncTable = false;      // the source lists its sync samples
};

using ffmpeg::failure;

// The source track box with this track id, or empty.
QByteArray trackBox(const QByteArray& moov, int trackId) {
    const std::vector<Box> top = mp4::children(moov, 0, moov.size());
    if (top.empty())
        return {};
    for (const Box& trak : mp4::children(moov, top[0])) {
        if (trak.type != "trak")
            continue;
        const std::vector<Box> inTrak = mp4::children(moov, trak);
        const Box* tkhd = mp4::find(inTrak, "tkhd");
        const bool wide = tkhd && mp4::version(moov, *tkhd) == 1;
        if (!tkhd || !mp4::holds(*tkhd, wide ? 24 : 16))
            continue;
        if (int(mp4::read32(moov, tkhd->body + (wide ? 20 : 12))) == trackId)
            return trak.bytes(moov);
    }
    return {};
}

// A track qualifies when its samples are shown in decode order (no
// composition offsets) and its edit list is at most a delay and one edit, so
// the demuxer's index is the file's sample table in order.
bool qualifies(const QByteArray& trak, bool* syncTable) {
    const std::vector<Box> inTrak = mp4::children(trak, 0, trak.size());
    if (inTrak.empty())
        return false;
    const std::vector<Box> parts = mp4::children(trak, inTrak[0]);
    if (const Box* edts = mp4::find(parts, "edts")) {
        const std::vector<Box> inEdts = mp4::children(trak, *edts);
        const Box* elst = mp4::find(inEdts, "elst");
        if (elst) {
            if (!mp4::holds(*elst, 8))
                return false;
            // One edit, or a delay (an empty edit) and one edit.
            const quint32 count = mp4::read32(trak, elst->body + 4);
            const bool wide = mp4::version(trak, *elst) == 1;
            const qint64 firstMediaTime = elst->body + 8 + (wide ? 8 : 4);
            const bool delayFirst = count == 2 && elst->end >= firstMediaTime + 8 &&
                                    (wide ? qint64(mp4::read64(trak, firstMediaTime)) == -1
                                          : qint32(mp4::read32(trak, firstMediaTime)) == -1);
            if (count > 1 && !delayFirst)
                return false;
        }
    }
    const Box* mdia = mp4::find(parts, "mdia");
    const std::vector<Box> inMdia = mdia ? mp4::children(trak, *mdia) : std::vector<Box>();
    const Box* minf = mp4::find(inMdia, "minf");
    const std::vector<Box> inMinf = minf ? mp4::children(trak, *minf) : std::vector<Box>();
    const Box* stbl = mp4::find(inMinf, "stbl");
    if (!stbl || !mp4::find(inMdia, "mdhd") || !mp4::find(inMdia, "hdlr"))
        return false;
    const std::vector<Box> inStbl = mp4::children(trak, *stbl);
    *syncTable = mp4::find(inStbl, "stss") != nullptr;
    return mp4::find(inStbl, "stsd") && !mp4::find(inStbl, "ctts");
}

// The box `path` (types, outermost first) inside `data`, or null.
const Box* descend(const QByteArray& data, std::vector<std::vector<Box>>& keep,
                   std::initializer_list<const char*> path) {
    keep.push_back(mp4::children(data, 0, data.size()));
    const Box* at = nullptr;
    for (const char* type : path) {
        at = mp4::find(keep.back(), type);
        if (!at)
            return nullptr;
        keep.push_back(mp4::children(data, *at));
    }
    return at;
}

// Writes `length` bytes from `in` at `from` to `out` at its position, in the
// kernel when it can; checks for cancellation between chunks.
ErrorPtr copySpan(int in, std::int64_t from, int out, std::int64_t length, const ExportJob& job) {
    loff_t inOffset = from;
    std::int64_t left = length;
    bool kernel = true;
    std::vector<char> buffer;
    while (left > 0) {
        if (job.isCancelled())
            return makeError(kExportCancelledCode, mediaErrorDomain(), QStringLiteral("cancelled"));
        const size_t chunk = size_t(std::min<std::int64_t>(left, 64 << 20));
        ssize_t done = -1;
        if (kernel) {
            done = copy_file_range(in, &inOffset, out, nullptr, chunk, 0);
            if (done < 0 &&
                (errno == EXDEV || errno == ENOSYS || errno == EINVAL || errno == EOPNOTSUPP)) {
                kernel = false; // another file system, or an old kernel: copy by hand
                continue;
            }
        } else {
            buffer.resize(std::min<size_t>(chunk, 4 << 20));
            done = pread(in, buffer.data(), buffer.size(), inOffset);
            if (done > 0) {
                for (ssize_t written = 0; written < done;) {
                    const ssize_t w = write(out, buffer.data() + written, size_t(done - written));
                    if (w < 0)
                        return failure(AVERROR(errno), QStringLiteral("cannot write the output"));
                    written += w;
                }
                inOffset += done;
            }
        }
        if (done < 0)
            return failure(AVERROR(errno), QStringLiteral("cannot copy the samples"));
        if (done == 0)
            return failure(AVERROR_EOF, QStringLiteral("the source ends early"));
        left -= done;
        if (job.progress)
            job.progress(float(length - left) / float(length));
    }
    return nullptr;
}

// Appends the clip's box for one track: the source's headers, an edit list
// that starts play at the requested start, and tables for the copied samples
// at their places in the new file. False when the source track lacks a box.
bool writeTrack(mp4::Writer& w, const SpanTrack& t, int movieScale, std::int64_t payloadAt,
                std::int64_t spanFrom) {
    const QByteArray& trak = t.trak;
    std::vector<std::vector<Box>> k;
    const Box* tkhd = descend(trak, k, {"trak", "tkhd"});
    std::vector<std::vector<Box>> k2;
    const Box* mdhd = descend(trak, k2, {"trak", "mdia", "mdhd"});
    std::vector<std::vector<Box>> k3;
    const Box* hdlr = descend(trak, k3, {"trak", "mdia", "hdlr"});
    std::vector<std::vector<Box>> k4;
    const Box* minf = descend(trak, k4, {"trak", "mdia", "minf"});
    std::vector<std::vector<Box>> k5;
    const Box* stsd = descend(trak, k5, {"trak", "mdia", "minf", "stbl", "stsd"});
    if (!tkhd || !mdhd || !hdlr || !minf || !stsd)
        return false;
    // The fields rewritten below lie at fixed offsets: the boxes must reach them.
    const bool thWide = mp4::version(trak, *tkhd) == 1;
    const bool mhWide = mp4::version(trak, *mdhd) == 1;
    if (!mp4::holds(*tkhd, thWide ? 36 : 24) || !mp4::holds(*mdhd, mhWide ? 32 : 20))
        return false;
    const AVRational tb = t.stream->time_base;
    const std::int64_t editMovie = StreamTime::fromMediaTime(
        StreamTime::toMediaTime(t.cut.editDuration, tb), AVRational{1, movieScale});
    // Where, in the clip's media time (0 = its first sample), play starts.
    const std::int64_t first = t.samples.front().dts;
    const std::int64_t lead = t.cut.offset - first;
    std::int64_t mediaLength = 0;
    for (const Sample& s : t.samples)
        mediaLength += s.duration;

    w.begin("trak");
    QByteArray th = tkhd->bytes(trak);
    const qint64 thAt = (tkhd->body - tkhd->offset) + (thWide ? 28 : 20);
    if (thWide)
        mp4::write64(th, thAt, quint64(editMovie));
    else
        mp4::write32(th, thAt, quint32(editMovie));
    w.raw(th);

    w.begin("edts");
    w.beginFull("elst", 1, 0);
    if (lead >= 0) {
        w.u32(1);
        w.u64(quint64(editMovie));
        w.u64(quint64(lead));
    } else {
        // The track starts after the clip does: an empty edit first.
        const std::int64_t delay = StreamTime::fromMediaTime(StreamTime::toMediaTime(-lead, tb),
                                                             AVRational{1, movieScale});
        w.u32(2);
        w.u64(quint64(delay));
        w.u64(~quint64(0)); // media time -1: nothing plays
        w.u32(0x00010000);
        w.u64(quint64(std::max<std::int64_t>(0, editMovie - delay)));
        w.u64(0);
    }
    w.u32(0x00010000);
    w.end();
    w.end();

    w.begin("mdia");
    QByteArray mh = mdhd->bytes(trak);
    const qint64 mhAt = (mdhd->body - mdhd->offset) + (mhWide ? 24 : 16);
    if (mhWide)
        mp4::write64(mh, mhAt, quint64(mediaLength));
    else
        mp4::write32(mh, mhAt, quint32(mediaLength));
    w.raw(mh);
    w.raw(hdlr->bytes(trak));
    w.begin("minf");
    for (const Box& part : mp4::children(trak, *minf))
        if (part.type != "stbl")
            w.raw(part.bytes(trak));
    w.begin("stbl");
    w.raw(stsd->bytes(trak));
    // Decode times: runs of equal durations.
    std::vector<std::pair<quint32, quint32>> runs;
    for (const Sample& s : t.samples) {
        if (!runs.empty() && runs.back().second == quint32(s.duration))
            ++runs.back().first;
        else
            runs.push_back({1, quint32(s.duration)});
    }
    w.beginFull("stts", 0, 0);
    w.u32(quint32(runs.size()));
    for (const auto& [count, delta] : runs) {
        w.u32(count);
        w.u32(delta);
    }
    w.end();
    if (t.syncTable) {
        w.beginFull("stss", 0, 0);
        std::vector<quint32> keys;
        for (size_t s = 0; s < t.samples.size(); ++s)
            if (t.samples[s].key)
                keys.push_back(quint32(s + 1));
        w.u32(quint32(keys.size()));
        for (quint32 key : keys)
            w.u32(key);
        w.end();
    }
    w.beginFull("stsc", 0, 0); // one sample per chunk
    w.u32(1);
    w.u32(1);
    w.u32(1);
    w.u32(1);
    w.end();
    w.beginFull("stsz", 0, 0);
    w.u32(0);
    w.u32(quint32(t.samples.size()));
    for (const Sample& s : t.samples)
        w.u32(quint32(s.size));
    w.end();
    w.beginFull("co64", 0, 0);
    w.u32(quint32(t.samples.size()));
    for (const Sample& s : t.samples)
        w.u64(quint64(payloadAt + (s.pos - spanFrom)));
    w.end();
    w.end(); // stbl
    w.end(); // minf
    w.end(); // mdia
    w.end(); // trak
    return true;
}

} // namespace

bool trySpanCopyExport(const ExportJob& job, ErrorPtr* error) {
    // A mix or a volume change needs the audio encoded.
    if (job.audioMix)
        for (const AudioMixInputParameters& p : job.audioMix->inputParameters)
            if (p.volume != 1.0f || job.audioMix->inputParameters.size() > 1)
                return false;
    int err = 0;
    ffmpeg::InputPtr input = ffmpeg::openInput(job.sourcePath, &err);
    if (!input || !std::strstr(input->iformat->name, "mp4"))
        return false;
    QFile source(job.sourcePath);
    if (!source.open(QIODevice::ReadOnly))
        return false;
    qint64 ignored = 0;
    const QByteArray moov = mp4::readTopLevelBox(source, "moov", &ignored);
    const QByteArray ftyp = mp4::readTopLevelBox(source, "ftyp", &ignored, 4096);
    if (moov.isEmpty() || ftyp.isEmpty())
        return false;
    std::vector<std::vector<Box>> keep;
    const Box* mvhd = descend(moov, keep, {"moov", "mvhd"});
    const bool mvhdWide = mvhd && mp4::version(moov, *mvhd) == 1;
    if (!mvhd || !mp4::holds(*mvhd, mvhdWide ? 32 : 20))
        return false;
    const int movieScale = int(mp4::read32(moov, mvhd->body + (mvhdWide ? 20 : 12)));
    if (movieScale <= 0)
        return false;
    // Fragments keep their samples out of the movie box, and may reorder
    // them in their run boxes: the ClipWriter takes those.
    SourceIndex index = SourceIndex::scan(input.get(), job.sourcePath);
    if (index.fragmented())
        return false;
    const MediaTime movieStart = input->start_time == AV_NOPTS_VALUE
                                     ? MediaTime::zero()
                                     : StreamTime::toMediaTime(input->start_time, AV_TIME_BASE_Q);

    // Plan every track from the index, as the ClipWriter would.
    std::vector<SpanTrack> tracks;
    int videoTrack = -1;
    for (unsigned i = 0; i < input->nb_streams; ++i) {
        AVStream* stream = input->streams[i];
        const IndexedTrack* indexed = index.track(int(i));
        if (!indexed)
            continue;
        if (!copiesAsItIs(job.rule, stream->codecpar->codec_id) || indexed->reordered)
            return false;
        SpanTrack track;
        track.stream = stream;
        track.trak = trackBox(moov, stream->id);
        if (track.trak.isEmpty() || !qualifies(track.trak, &track.syncTable))
            return false;
        const bool video = stream->codecpar->codec_type == AVMEDIA_TYPE_VIDEO;
        const std::vector<Sample>& all = indexed->samples;
        if (all.empty())
            continue;
        if (stream->duration == AV_NOPTS_VALUE)
            return false;
        for (const Sample& s : all)
            if (s.size <= 0)
                return false;
        track.cut = CutPlanner::planTrack(
            indexed->info,
            StreamTime::fromMediaTime(job.range.start + movieStart, stream->time_base),
            StreamTime::fromMediaTime(job.range.end() + movieStart, stream->time_base));
        if (track.cut.empty)
            continue;
        for (const Sample& s : all)
            if (s.dts >= track.cut.firstDts && s.dts < track.cut.stopAt)
                track.samples.push_back(s);
        if (track.samples.empty())
            continue;
        if (video && videoTrack < 0)
            videoTrack = int(tracks.size());
        tracks.push_back(std::move(track));
    }
    if (tracks.empty())
        return false; // the ClipWriter reports why

    // Start at the frame shown at the requested start, as the remuxer does.
    if (videoTrack >= 0) {
        const SpanTrack& v = tracks[videoTrack];
        std::int64_t shown = AV_NOPTS_VALUE;
        for (const Sample& s : v.samples)
            if (s.dts <= v.cut.offset)
                shown = s.dts;
        if (shown != AV_NOPTS_VALUE) {
            const MediaTime at = StreamTime::toMediaTime(shown, v.stream->time_base);
            for (SpanTrack& t : tracks)
                t.cut = CutPlanner::startingAt(t.cut,
                                               StreamTime::fromMediaTime(at, t.stream->time_base));
        }
    }

    std::int64_t spanFrom = INT64_MAX, spanTo = 0;
    for (SpanTrack& t : tracks) {
        Sample& last = t.samples.back();
        const std::int64_t end = t.cut.offset + t.cut.editDuration;
        if (last.dts < end && last.dts + last.duration > end)
            last.duration = end - last.dts;
        for (const Sample& s : t.samples) {
            spanFrom = std::min(spanFrom, s.pos);
            spanTo = std::max(spanTo, s.pos + s.size);
        }
    }
    // Interleaved tracks the clip leaves out still sit in the span; copying
    // them is cheaper than gathering, unless they are most of it.
    std::int64_t payload = 0;
    for (const SpanTrack& t : tracks)
        for (const Sample& s : t.samples)
            payload += s.size;
    if (spanTo - spanFrom > 2 * payload + (8 << 20))
        return false;

    // The movie box: the source's headers with new tables.
    // The payload lands at the same offset within a page as in the source:
    // the kernel then copies whole pages, a good fifth faster than when the
    // two are out of step. A free box takes up the difference.
    const std::int64_t mdatHeader = 16;
    const std::int64_t page = 4096;
    std::int64_t padding = ((spanFrom - (ftyp.size() + mdatHeader)) % page + page) % page;
    if (padding > 0 && padding < 8)
        padding += page;
    const std::int64_t payloadAt = ftyp.size() + padding + mdatHeader;
    mp4::Writer w;
    w.begin("moov");
    {
        QByteArray header = mvhd->bytes(moov);
        std::int64_t longest = 0;
        for (const SpanTrack& t : tracks)
            longest = std::max(longest,
                               StreamTime::fromMediaTime(
                                   StreamTime::toMediaTime(t.cut.editDuration, t.stream->time_base),
                                   AVRational{1, movieScale}));
        const qint64 at = (mvhd->body - mvhd->offset) + (mvhdWide ? 24 : 16);
        if (mvhdWide)
            mp4::write64(header, at, quint64(longest));
        else
            mp4::write32(header, at, quint32(longest));
        w.raw(header);
    }
    for (const SpanTrack& t : tracks)
        if (!writeTrack(w, t, movieScale, payloadAt, spanFrom))
            return false;
    w.end(); // moov
    input.reset();

    QFile output(job.outputPath);
    if (!output.open(QIODevice::WriteOnly | QIODevice::Truncate)) {
        *error = failure(AVERROR(EACCES), QStringLiteral("cannot write the output"));
        return true;
    }
    mp4::Writer head;
    head.raw(ftyp);
    if (padding > 0) {
        head.u32(quint32(padding));
        head.raw(QByteArrayLiteral("free"));
        head.raw(QByteArray(int(padding - 8), '\0'));
    }
    head.u32(1);
    head.raw(QByteArrayLiteral("mdat"));
    head.u64(quint64(mdatHeader + (spanTo - spanFrom)));
    if (output.write(head.data()) != head.data().size() || !output.flush()) {
        *error = failure(AVERROR(EIO), QStringLiteral("cannot write the output"));
        return true;
    }
    // The kernel appends at the descriptor's position, past what Qt wrote.
    if (ErrorPtr e = copySpan(source.handle(), spanFrom, output.handle(), spanTo - spanFrom, job)) {
        *error = e;
        return true;
    }
    if (!output.seek(payloadAt + (spanTo - spanFrom)) ||
        output.write(w.data()) != w.data().size() || !output.flush()) {
        *error = failure(AVERROR(EIO), QStringLiteral("cannot write the output"));
        return true;
    }
    *error = nullptr;
    return true;
}

} // namespace platform
