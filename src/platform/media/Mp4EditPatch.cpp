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
    const auto* p = reinterpret_cast<const uchar*>(d.constData() + at);
    return wide ? qFromBigEndian<quint64>(p) : qFromBigEndian<quint32>(p);
}

void writeField(QByteArray& d, qint64 at, bool wide, quint64 value) {
    auto* p = reinterpret_cast<uchar*>(d.data() + at);
    if (wide)
        qToBigEndian<quint64>(value, p);
    else
        qToBigEndian<quint32>(quint32(std::min<quint64>(value, 0xffffffffu)), p);
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
    if (!mvhd || mvhd->end - mvhd->body < 32)
        return fail(QStringLiteral("no movie header"));
    const bool mvhdWide = moov[mvhd->body] == 1;
    const qint64 timescaleAt = mvhd->body + (mvhdWide ? 20 : 12);
    const quint32 movieTimescale =
        qFromBigEndian<quint32>(reinterpret_cast<const uchar*>(moov.constData() + timescaleAt));
    if (movieTimescale == 0)
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
        if (!tkhd)
            return fail(QStringLiteral("no track header"));
        const bool tkhdWide = moov[tkhd->body] == 1;
        const qint64 tkhdDurationAt = tkhd->body + (tkhdWide ? 28 : 20);
        quint64 total = readField(moov, tkhdDurationAt, tkhdWide);
        if (elst && track < durations.size() && durations[track].isNumeric()) {
            const bool wide = moov[elst->body] == 1;
            const qint64 entrySize = wide ? 20 : 12;
            const quint32 count = quint32(readField(moov, elst->body + 4, false));
            if (count == 0 || elst->body + 8 + count * entrySize > elst->end)
                return fail(QStringLiteral("damaged edit list"));
            const std::int64_t wanted =
                StreamTime::fromMediaTime(durations[track], AVRational{1, int(movieTimescale)});
            // Empty edits (a delayed start) come first and stay; the last
            // edit is what plays.
            total = 0;
            for (quint32 i = 0; i < count; ++i) {
                const qint64 entry = elst->body + 8 + i * entrySize;
                quint64 segment = readField(moov, entry, wide);
                const std::int64_t left = wanted - std::int64_t(total);
                if (i + 1 == count && left > 0 && quint64(left) < segment) {
                    segment = quint64(left);
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
