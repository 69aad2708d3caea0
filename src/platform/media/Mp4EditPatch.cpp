#include "Mp4EditPatch.h"

#include "Mp4Box.h"
#include "StreamTime.h"

#include <QFile>
#include <QtEndian>

#include <algorithm>

namespace platform {
namespace {

using mp4::Box;
using mp4::children;
using mp4::find;

quint64 readField(const QByteArray& d, qint64 at, bool wide) {
    return wide ? mp4::read64(d, at) : mp4::read32(d, at);
}

void writeField(QByteArray& d, qint64 at, bool wide, quint64 value) {
    if (wide)
        mp4::write64(d, at, value);
    else
        mp4::write32(d, at, quint32(std::min<quint64>(value, 0xffffffffu)));
}

} // namespace

bool shortenEdits(const QString& hostPath, const std::vector<MediaTime>& durations,
                  QString* error) {
    auto fail = [&](const QString& why) {
        if (error)
            *error = why;
        return false;
    };
    QFile file(hostPath);
    if (!file.open(QIODevice::ReadWrite))
        return fail(file.errorString());
    qint64 moovAt = -1;
    QByteArray moov = mp4::readTopLevelBox(file, "moov", &moovAt);
    if (moov.isEmpty())
        return fail(QStringLiteral("no movie box"));

    const std::vector<Box> top = children(moov, 0, moov.size());
    if (top.empty())
        return fail(QStringLiteral("no movie box"));
    const std::vector<Box> inMoov = children(moov, top[0].body, top[0].end);
    const Box* mvhd = find(inMoov, "mvhd");
    if (!mvhd || !mp4::holds(*mvhd, 32))
        return fail(QStringLiteral("no movie header"));
    const bool mvhdWide = mp4::version(moov, *mvhd) == 1;
    const qint64 timescaleAt = mvhd->body + (mvhdWide ? 20 : 12);
    const quint32 movieTimescale = mp4::read32(moov, timescaleAt);
    if (movieTimescale == 0 || movieTimescale > quint32(INT32_MAX))
        return fail(QStringLiteral("no movie timescale"));

    quint64 movieDuration = 0;
    size_t track = 0;
    for (const Box& trak : inMoov) {
        if (trak.type != "trak")
            continue;
        const std::vector<Box> inTrak = children(moov, trak.body, trak.end);
        const Box* tkhd = find(inTrak, "tkhd");
        const Box* edts = find(inTrak, "edts");
        const std::vector<Box> inEdts =
            edts ? children(moov, edts->body, edts->end) : std::vector<Box>();
        const Box* elst = find(inEdts, "elst");
        const bool tkhdWide = tkhd && mp4::version(moov, *tkhd) == 1;
        if (!tkhd || !mp4::holds(*tkhd, tkhdWide ? 36 : 24))
            return fail(QStringLiteral("no track header"));
        const qint64 tkhdDurationAt = tkhd->body + (tkhdWide ? 28 : 20);
        quint64 total = readField(moov, tkhdDurationAt, tkhdWide);
        if (elst && track < durations.size() && durations[track].isNumeric()) {
            const bool wide = mp4::version(moov, *elst) == 1;
            const qint64 entrySize = wide ? 20 : 12;
            if (!mp4::holds(*elst, 8))
                return fail(QStringLiteral("damaged edit list"));
            const quint32 count = quint32(readField(moov, elst->body + 4, false));
            if (count == 0 || elst->body + 8 + qint64(count) * entrySize > elst->end)
                return fail(QStringLiteral("damaged edit list"));
            const std::int64_t wanted =
                StreamTime::fromMediaTime(durations[track], AVRational{1, int(movieTimescale)});
            // Empty edits (a delayed start) come first and stay; the last
            // edit is what plays.
            total = 0;
            for (quint32 i = 0; i < count; ++i) {
                const qint64 entry = elst->body + 8 + i * entrySize;
                quint64 segment = readField(moov, entry, wide);
                // Unsigned: a damaged list may sum past what a signed count holds.
                const quint64 goal = wanted > 0 ? quint64(wanted) : 0;
                if (i + 1 == count && total < goal && goal - total < segment) {
                    segment = goal - total;
                    writeField(moov, entry, wide, segment);
                }
                total += segment;
            }
            writeField(moov, tkhdDurationAt, tkhdWide, total);
        }
        movieDuration = std::max(movieDuration, total);
        ++track;
    }
    writeField(moov, timescaleAt + 4, mvhdWide, movieDuration);
    file.seek(moovAt);
    if (file.write(moov) != moov.size())
        return fail(file.errorString());
    return true;
}

} // namespace platform
