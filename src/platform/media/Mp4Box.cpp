#include "Mp4Box.h"

#include <algorithm>

namespace platform::mp4 {

std::vector<Box> children(const QByteArray& data, qint64 from, qint64 to) {
    std::vector<Box> boxes;
    to = std::min<qint64>(to, data.size());
    qint64 at = std::max<qint64>(from, 0);
    while (at + 8 <= to) {
        quint64 size = read32(data, at);
        qint64 header = 8;
        if (size == 1 && at + 16 <= to) {
            size = read64(data, at + 8);
            header = 16;
        } else if (size == 0) {
            size = quint64(to - at);
        }
        // Compared unsigned: a 64-bit size past 2^63 must not wrap around.
        if (size < quint64(header) || size > quint64(to - at))
            break;
        boxes.push_back({at, at + header, at + qint64(size), data.mid(at + 4, 4)});
        at += qint64(size);
    }
    return boxes;
}

const Box* find(const std::vector<Box>& boxes, const char* type) {
    for (const Box& b : boxes)
        if (b.type == type)
            return &b;
    return nullptr;
}

QByteArray readTopLevelBox(QFile& file, const char* type, qint64* offset, qint64 limit) {
    qint64 at = 0;
    const qint64 fileSize = file.size();
    while (at + 8 <= fileSize) {
        if (!file.seek(at))
            return {};
        const QByteArray header = file.read(16);
        if (header.size() < 8)
            return {};
        quint64 size = read32(header, 0);
        if (size == 1 && header.size() == 16)
            size = read64(header, 8);
        else if (size == 0)
            size = quint64(fileSize - at);
        if (size < 8 || size > quint64(fileSize - at))
            return {}; // a box that claims more than the file holds
        if (header.mid(4, 4) == type) {
            if (qint64(size) > limit || !file.seek(at))
                return {};
            if (offset)
                *offset = at;
            QByteArray box = file.read(qint64(size));
            return box.size() == qint64(size) ? box : QByteArray();
        }
        at += qint64(size);
    }
    return {};
}

} // namespace platform::mp4
