#include "FragmentIndex.h"

#include "Mp4Box.h"

#include <QFile>

#include <map>

namespace platform {
namespace {

using mp4::Box;

// ISO/IEC 14496-12 sample flags: bit 16 marks a sample that is not a sync
// sample.
constexpr quint32 kNonSyncSample = 0x10000;

struct TrackDefaults {
    quint32 duration = 0, size = 0, flags = 0;
};

struct TrackState {
    FragmentTrack* track = nullptr;
    TrackDefaults defaults;
    std::int64_t nextDts = 0;
    std::int64_t firstOffset = 0;
    bool anyOffset = false;
};

const Box* child(const QByteArray& data, const Box& parent, std::vector<Box>& keep,
                 const char* type) {
    keep = mp4::children(data, parent);
    return mp4::find(keep, type);
}

std::int64_t field(const QByteArray& d, qint64 at, bool wide) {
    return wide ? std::int64_t(mp4::read64(d, at)) : std::int64_t(mp4::read32(d, at));
}

// Reads one movie fragment. False when the boxes are damaged or a sample
// lies past `fileSize` (the fragment is incomplete).
bool readFragment(const QByteArray& moof, qint64 moofAt, qint64 fileSize,
                  std::map<int, TrackState>& states, std::int64_t* dataEnd) {
    const std::vector<Box> top = mp4::children(moof, 0, moof.size());
    if (top.empty())
        return false;
    // A track fragment's data, unless it says otherwise, follows the previous
    // one's (ISO/IEC 14496-12, 8.8.7).
    std::int64_t previousEnd = moofAt;
    for (const Box& traf : mp4::children(moof, top[0])) {
        if (traf.type != "traf")
            continue;
        const std::vector<Box> parts = mp4::children(moof, traf);
        const Box* tfhd = mp4::find(parts, "tfhd");
        if (!tfhd || tfhd->end - tfhd->body < 8)
            return false;
        const quint32 flags = mp4::read32(moof, tfhd->body) & 0xffffff;
        const int trackId = int(mp4::read32(moof, tfhd->body + 4));
        qint64 at = tfhd->body + 8;
        const auto it = states.find(trackId);
        if (it == states.end())
            continue; // a track the movie box does not declare
        TrackState& state = it->second;
        TrackDefaults defaults = state.defaults;
        std::int64_t base = (flags & 0x20000) ? moofAt : previousEnd;
        auto take32 = [&](quint32* to) {
            if (at + 4 > tfhd->end)
                return false;
            *to = mp4::read32(moof, at);
            at += 4;
            return true;
        };
        if (flags & 0x1) {
            if (at + 8 > tfhd->end)
                return false;
            base = std::int64_t(mp4::read64(moof, at));
            at += 8;
        }
        quint32 ignored = 0;
        if (((flags & 0x2) && !take32(&ignored)) ||
            ((flags & 0x8) && !take32(&defaults.duration)) ||
            ((flags & 0x10) && !take32(&defaults.size)) ||
            ((flags & 0x20) && !take32(&defaults.flags)))
            return false;
        if (const Box* tfdt = mp4::find(parts, "tfdt"); tfdt && tfdt->end - tfdt->body >= 8) {
            const bool wide = moof[tfdt->body] == 1;
            state.nextDts = field(moof, tfdt->body + 4, wide);
        }
        std::int64_t dataAt = base;
        for (const Box& trun : parts) {
            if (trun.type != "trun")
                continue;
            if (trun.end - trun.body < 8)
                return false;
            const int version = quint8(moof[trun.body]);
            const quint32 runFlags = mp4::read32(moof, trun.body) & 0xffffff;
            const quint32 count = mp4::read32(moof, trun.body + 4);
            qint64 p = trun.body + 8;
            if (runFlags & 0x1) {
                dataAt = base + qint32(mp4::read32(moof, p));
                p += 4;
            }
            quint32 firstFlags = defaults.flags;
            const bool hasFirstFlags = runFlags & 0x4;
            if (hasFirstFlags) {
                firstFlags = mp4::read32(moof, p);
                p += 4;
            }
            const int perSample = 4 * (((runFlags >> 8) & 1) + ((runFlags >> 9) & 1) +
                                       ((runFlags >> 10) & 1) + ((runFlags >> 11) & 1));
            if (p + qint64(count) * perSample > trun.end)
                return false;
            for (quint32 i = 0; i < count; ++i) {
                quint32 duration = defaults.duration, size = defaults.size;
                quint32 sampleFlags = i == 0 && hasFirstFlags ? firstFlags : defaults.flags;
                std::int64_t offset = 0;
                if (runFlags & 0x100)
                    duration = mp4::read32(moof, p), p += 4;
                if (runFlags & 0x200)
                    size = mp4::read32(moof, p), p += 4;
                if (runFlags & 0x400)
                    sampleFlags = mp4::read32(moof, p), p += 4;
                if (runFlags & 0x800) {
                    const quint32 raw = mp4::read32(moof, p);
                    offset = version == 0 ? std::int64_t(raw) : std::int64_t(qint32(raw));
                    p += 4;
                }
                if (dataAt + size > fileSize)
                    return false;
                FragmentSample sample;
                sample.dts = state.nextDts;
                sample.pts = state.nextDts + offset;
                sample.pos = dataAt;
                sample.size = size;
                sample.duration = duration;
                sample.key = !(sampleFlags & kNonSyncSample);
                if (state.track->samples.empty() && !state.anyOffset) {
                    state.firstOffset = offset;
                    state.anyOffset = true;
                } else if (offset != state.firstOffset) {
                    state.track->reordered = true;
                }
                state.track->samples.push_back(sample);
                state.nextDts += duration;
                dataAt += size;
                *dataEnd = std::max(*dataEnd, dataAt);
            }
        }
        previousEnd = dataAt;
    }
    return true;
}

// Whether the movie box holds a movie extends box, read from the box
// headers alone: most files are not fragmented, and their movie boxes are
// large.
bool declaresFragments(QFile& file) {
    const qint64 fileSize = file.size();
    qint64 at = 0, end = fileSize;
    bool inMoov = false;
    while (at + 8 <= end) {
        if (!file.seek(at))
            return false;
        const QByteArray header = file.read(16);
        if (header.size() < 8)
            return false;
        quint64 size = mp4::read32(header, 0);
        qint64 headerSize = 8;
        if (size == 1 && header.size() == 16) {
            size = mp4::read64(header, 8);
            headerSize = 16;
        } else if (size == 0) {
            size = quint64(end - at);
        }
        if (size < quint64(headerSize))
            return false;
        const QByteArray type = header.mid(4, 4);
        if (inMoov && type == "mvex")
            return true;
        if (!inMoov && type == "moov") {
            inMoov = true;
            end = std::min<qint64>(fileSize, at + qint64(size));
            at += headerSize;
            continue;
        }
        at += qint64(size);
    }
    return false;
}

} // namespace

const FragmentTrack* FragmentIndex::track(int trackId) const {
    for (const FragmentTrack& t : tracks)
        if (t.trackId == trackId)
            return &t;
    return nullptr;
}

std::optional<FragmentIndex> FragmentIndex::read(const QString& hostPath) {
    QFile file(hostPath);
    if (!file.open(QIODevice::ReadOnly) || !declaresFragments(file))
        return std::nullopt;
    qint64 moovAt = 0;
    const QByteArray moov = mp4::readTopLevelBox(file, "moov", &moovAt, 64 << 20);
    if (moov.isEmpty())
        return std::nullopt;
    const std::vector<Box> top = mp4::children(moov, 0, moov.size());
    if (top.empty())
        return std::nullopt;
    const std::vector<Box> inMoov = mp4::children(moov, top[0]);
    const Box* mvex = mp4::find(inMoov, "mvex");
    if (!mvex)
        return std::nullopt;

    FragmentIndex index;
    index.fileSize = file.size();
    index.tracks.reserve(inMoov.size());
    std::map<int, TrackState> states;
    for (const Box& trak : inMoov) {
        if (trak.type != "trak")
            continue;
        std::vector<Box> k1, k2, k3;
        const Box* tkhd = child(moov, trak, k1, "tkhd");
        const Box* mdia = child(moov, trak, k2, "mdia");
        const Box* mdhd = mdia ? child(moov, *mdia, k3, "mdhd") : nullptr;
        if (!tkhd || !mdhd)
            continue;
        const bool tkhdWide = moov[tkhd->body] == 1;
        const bool mdhdWide = moov[mdhd->body] == 1;
        FragmentTrack track;
        track.trackId = int(mp4::read32(moov, tkhd->body + (tkhdWide ? 20 : 12)));
        track.timescale = std::int32_t(mp4::read32(moov, mdhd->body + (mdhdWide ? 20 : 12)));
        index.tracks.push_back(track);
    }
    for (FragmentTrack& track : index.tracks)
        states[track.trackId].track = &track;
    for (const Box& trex : mp4::children(moov, *mvex)) {
        if (trex.type != "trex" || trex.end - trex.body < 24)
            continue;
        const auto it = states.find(int(mp4::read32(moov, trex.body + 4)));
        if (it != states.end())
            it->second.defaults = {mp4::read32(moov, trex.body + 12),
                                   mp4::read32(moov, trex.body + 16),
                                   mp4::read32(moov, trex.body + 20)};
    }

    // Walk the top-level boxes, reading only the fragment headers.
    qint64 at = 0;
    index.completeBytes = moovAt + moov.size();
    while (at + 8 <= index.fileSize) {
        if (!file.seek(at))
            break;
        const QByteArray header = file.read(16);
        if (header.size() < 8)
            break;
        quint64 size = mp4::read32(header, 0);
        if (size == 1 && header.size() == 16)
            size = mp4::read64(header, 8);
        else if (size == 0)
            size = quint64(index.fileSize - at);
        if (size < 8 || at + qint64(size) > index.fileSize)
            break; // a box cut short: the end of what was written
        if (header.mid(4, 4) == "moof") {
            if (size > (16u << 20) || !file.seek(at))
                break;
            const QByteArray moof = file.read(qint64(size));
            std::int64_t dataEnd = at + qint64(size);
            // Samples are added as they are read; a fragment that turns out
            // incomplete takes its samples back out.
            std::vector<size_t> counts;
            for (const FragmentTrack& t : index.tracks)
                counts.push_back(t.samples.size());
            std::map<int, TrackState> before = states;
            if (moof.size() != qint64(size) ||
                !readFragment(moof, at, index.fileSize, states, &dataEnd)) {
                for (size_t t = 0; t < index.tracks.size(); ++t)
                    index.tracks[t].samples.resize(counts[t]);
                states = before;
                break;
            }
            index.completeBytes = std::max<std::int64_t>(index.completeBytes, dataEnd);
        }
        at += qint64(size);
    }
    return index;
}

} // namespace platform
