#include "Mp4Box.h"
#include "Mp4EditPatch.h"

#include <QFile>
#include <QTemporaryDir>
#include <gtest/gtest.h>

using namespace platform;

namespace {

// A movie box with one track whose edit list plays `segment` of movie time
// 600, version 0 headers throughout; the box named `cut` holds only two
// bytes, too short for its fields.
QByteArray movieWithEdit(quint32 segment, const QByteArray& cut = {}) {
    mp4::Writer w;
    const auto header = [&](const char* type, quint32 flags) {
        if (cut == type) {
            w.begin(type);
            w.u16(0);
            return false;
        }
        w.beginFull(type, 0, flags);
        return true;
    };
    w.begin("moov");
    if (header("mvhd", 0)) {
        w.u32(0);
        w.u32(0);
        w.u32(600);     // timescale
        w.u32(segment); // duration
        w.raw(QByteArray(80, '\0'));
    }
    w.end();
    w.begin("trak");
    if (header("tkhd", 7)) {
        w.u32(0);
        w.u32(0);
        w.u32(1); // track id
        w.u32(0);
        w.u32(segment); // duration
        w.raw(QByteArray(60, '\0'));
    }
    w.end();
    w.begin("edts");
    if (header("elst", 0)) {
        w.u32(2);
        w.u32(30); // an empty edit first
        w.u32(quint32(-1));
        w.u32(0x10000);
        w.u32(segment - 30);
        w.u32(0);
        w.u32(0x10000);
    }
    w.end();
    w.end();
    w.end();
    w.end();
    return w.data();
}

QByteArray contents(const QString& path) {
    QFile file(path);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

bool write(const QString& path, const QByteArray& data) {
    QFile file(path);
    return file.open(QIODevice::WriteOnly) && file.write(data) == data.size();
}

} // namespace

// Boxes of every size header, and none read past their data however large
// a size they claim.
TEST(Mp4Box, TheReaderFindsBoxesOfEverySizeAndNothingOutsideTheData) {
    // A 64-bit size header, a box cut short by the end of the data, and a
    // 64-bit size past 2^63, which a signed reading turns negative.
    const QByteArray data = QByteArray::fromHex("00000010") + "moov" + QByteArray(8, 'm') +
                            QByteArray::fromHex("00000001") + "mdat" +
                            QByteArray::fromHex("0000000000000014") + QByteArray(4, 'x') +
                            QByteArray::fromHex("000000ff") + "free";
    const auto top = mp4::children(data, 0, data.size());
    ASSERT_EQ(top.size(), 2u);
    EXPECT_EQ(top[0].type, "moov");
    EXPECT_EQ(top[0].end, 16);
    EXPECT_EQ(top[1].type, "mdat");
    EXPECT_EQ(top[1].body - top[1].offset, 16);
    EXPECT_TRUE(mp4::find(top, "mdat"));
    EXPECT_FALSE(mp4::find(top, "free"));
    const QByteArray huge = QByteArray::fromHex("00000001") + "free" +
                            QByteArray::fromHex("8000000000000010") + QByteArray(16, 'x');
    EXPECT_TRUE(mp4::children(huge, 0, huge.size()).empty());
    // Bounds past the buffer are clipped to it; reads and writes outside it
    // touch nothing.
    const QByteArray small = QByteArray::fromHex("00000008") + "free";
    EXPECT_EQ(mp4::children(small, -8, 1 << 20).size(), 1u);
    EXPECT_EQ(mp4::read32(small, 6), 0u);
    EXPECT_EQ(mp4::read64(small, -1), 0u);
    QByteArray copy = small;
    mp4::write64(copy, 4, 1);
    EXPECT_EQ(copy, small);
    QTemporaryDir dir;
    QFile file(dir.filePath("huge.mp4"));
    ASSERT_TRUE(file.open(QIODevice::ReadWrite));
    file.write(huge + QByteArray::fromHex("00000008") + "moov");
    qint64 at = -1;
    EXPECT_TRUE(mp4::readTopLevelBox(file, "moov", &at).isEmpty());
}

TEST(Mp4Box, ShortenEditsCutsTheLastEditAndTheHeadersOnly) {
    QTemporaryDir dir;
    const QString path = dir.filePath("clip.mp4");
    const QByteArray ftyp = QByteArray::fromHex("00000010") + "ftypisom" + QByteArray(4, '\0');
    ASSERT_TRUE(write(path, ftyp + movieWithEdit(600)));
    QString error;
    // One second of 600 asked down to half: the empty edit of 30 stays, the
    // played one shrinks to 270, the headers follow.
    ASSERT_TRUE(shortenEdits(path, {MediaTime::make(1, 2)}, &error)) << error.toStdString();
    EXPECT_EQ(contents(path), ftyp + movieWithEdit(300));
    // Asking for more than is there changes nothing.
    ASSERT_TRUE(shortenEdits(path, {MediaTime::make(5, 1)}, &error));
    EXPECT_EQ(contents(path), ftyp + movieWithEdit(300));

    ASSERT_TRUE(write(path, "no boxes here at all"));
    EXPECT_FALSE(shortenEdits(path, {MediaTime::make(1, 1)}, &error));
    EXPECT_FALSE(error.isEmpty());
}

TEST(Mp4Box, HeadersTooShortForTheirFieldsLeaveTheFileAsItWas) {
    QTemporaryDir dir;
    const QString path = dir.filePath("clip.mp4");
    for (const char* type : {"mvhd", "tkhd", "elst"}) {
        const QByteArray damaged = movieWithEdit(600, type);
        ASSERT_TRUE(write(path, damaged));
        QString error;
        EXPECT_FALSE(shortenEdits(path, {MediaTime::make(1, 2)}, &error)) << type;
        EXPECT_FALSE(error.isEmpty()) << type;
        EXPECT_EQ(contents(path), damaged) << type;
    }
}
