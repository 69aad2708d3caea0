#pragma once

#include <QByteArray>
#include <QFile>
#include <QtEndian>

#include <cstdint>
#include <vector>

// Reading and writing ISO base media boxes in memory, for the two places that
// touch MP4 structure directly (the edit-list trim and the span copy).
// Internal to the media adapter.
namespace platform::mp4 {

struct Box {
    qint64 offset = 0; // of the header, in the buffer
    qint64 body = 0;   // of the contents
    qint64 end = 0;
    QByteArray type;

    QByteArray bytes(const QByteArray& data) const { return data.mid(offset, end - offset); }
};

// The boxes directly inside [from, to) of `data` (clipped to the buffer);
// stops at the first that does not fit.
std::vector<Box> children(const QByteArray& data, qint64 from, qint64 to);
inline std::vector<Box> children(const QByteArray& data, const Box& parent) {
    return children(data, parent.body, parent.end);
}

// The first box of that type, or null.
const Box* find(const std::vector<Box>& boxes, const char* type);

// Whether `data` holds `size` bytes from `at`.
inline bool fits(const QByteArray& data, qint64 at, qint64 size) {
    return at >= 0 && size >= 0 && at <= data.size() - size;
}
// Whether the box's contents hold `size` bytes: what a reader of fields at
// fixed offsets asks before it reads them.
inline bool holds(const Box& box, qint64 size) {
    return box.end - box.body >= size;
}
// The version byte of a full box; -1 for a box too short to have one.
inline int version(const QByteArray& data, const Box& box) {
    return holds(box, 1) && fits(data, box.body, 1) ? quint8(data.at(box.body)) : -1;
}

// Big-endian fields. Reads outside the buffer give 0 and writes outside it do
// nothing: callers check the box sizes first, and a damaged file that slips
// past a check still cannot reach memory outside the buffer.
inline quint32 read32(const QByteArray& d, qint64 at) {
    if (!fits(d, at, 4))
        return 0;
    return qFromBigEndian<quint32>(reinterpret_cast<const uchar*>(d.constData() + at));
}
inline quint64 read64(const QByteArray& d, qint64 at) {
    if (!fits(d, at, 8))
        return 0;
    return qFromBigEndian<quint64>(reinterpret_cast<const uchar*>(d.constData() + at));
}
inline void write32(QByteArray& d, qint64 at, quint32 v) {
    if (fits(d, at, 4))
        qToBigEndian<quint32>(v, reinterpret_cast<uchar*>(d.data() + at));
}
inline void write64(QByteArray& d, qint64 at, quint64 v) {
    if (fits(d, at, 8))
        qToBigEndian<quint64>(v, reinterpret_cast<uchar*>(d.data() + at));
}

// Reads the first top-level box of that type from a file, without reading
// the boxes before it; sets `offset` to where it starts. Empty when absent or
// larger than `limit`.
QByteArray readTopLevelBox(QFile& file, const char* type, qint64* offset, qint64 limit = 512 << 20);

// Appends big-endian fields to a box under construction.
class Writer {
  public:
    void u8(quint8 v) { data_.append(char(v)); }
    void u16(quint16 v) {
        u8(quint8(v >> 8));
        u8(quint8(v));
    }
    void u32(quint32 v) {
        u16(quint16(v >> 16));
        u16(quint16(v));
    }
    void u64(quint64 v) {
        u32(quint32(v >> 32));
        u32(quint32(v));
    }
    void raw(const QByteArray& bytes) { data_.append(bytes); }
    // Starts a box; close it with end().
    void begin(const char* type) {
        open_.push_back(data_.size());
        u32(0);
        data_.append(type, 4);
    }
    void beginFull(const char* type, quint8 version, quint32 flags) {
        begin(type);
        u32(quint32(version) << 24 | (flags & 0xffffff));
    }
    void end() {
        const qint64 at = open_.back();
        open_.pop_back();
        write32(data_, at, quint32(data_.size() - at));
    }
    const QByteArray& data() const { return data_; }

  private:
    QByteArray data_;
    std::vector<qint64> open_;
};

} // namespace platform::mp4
