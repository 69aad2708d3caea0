// The MP4 box reading the media adapter does by hand: the box tree, the
// top-level box lookup in a file, and the edit-list shortening that patches a
// finished clip in place.

#include "platform/media/MediaTime.h"
#include "platform/media/Mp4Box.h"
#include "platform/media/Mp4EditPatch.h"

#include <QFile>
#include <QTemporaryDir>
#include <cstdint>

using namespace platform;

namespace {

// Walks the whole tree, as deep as boxes nest, reading every box's bytes.
void walk(const QByteArray& data, qint64 from, qint64 to, int depth) {
    if (depth > 16)
        return;
    for (const mp4::Box& box : mp4::children(data, from, to)) {
        if (box.offset < from || box.body < box.offset || box.end < box.body || box.end > to)
            __builtin_trap(); // a box that does not lie inside its parent
        (void)box.bytes(data).size();
        walk(data, box.body, box.end, depth + 1);
    }
}

QTemporaryDir& scratch() {
    static QTemporaryDir dir;
    return dir;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const QByteArray bytes(reinterpret_cast<const char*>(data), qsizetype(size));
    walk(bytes, 0, bytes.size(), 0);

    const QString path = scratch().filePath(QStringLiteral("clip.mp4"));
    {
        QFile file(path);
        if (!file.open(QIODevice::WriteOnly | QIODevice::Truncate))
            return 0;
        file.write(bytes);
    }
    {
        QFile file(path);
        if (file.open(QIODevice::ReadOnly)) {
            qint64 at = -1;
            const QByteArray moov = mp4::readTopLevelBox(file, "moov", &at, 1 << 20);
            if (!moov.isEmpty() && (at < 0 || at + moov.size() > bytes.size()))
                __builtin_trap(); // a box read from outside the file
        }
    }
    QString error;
    shortenEdits(path, {MediaTime::fromSeconds(0.5, 1000), MediaTime::fromSeconds(0.25, 48000)},
                 &error);
    return 0;
}
