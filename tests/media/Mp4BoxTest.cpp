#include "Mp4Box.h"
#include "Mp4EditPatch.h"

#include <QFile>
#include <QTemporaryDir>
#include <functional>
#include <gtest/gtest.h>

using namespace platform;

namespace {

// A movie box with one track whose edit list plays `segment` of movie time
// 600, version 0 headers throughout.
QByteArray movieWithEdit(quint32 segment) {
    mp4::Writer w;
    w.begin("moov");
    w.beginFull("mvhd", 0, 0);
    w.u32(0);
    w.u32(0);
    w.u32(600);     // timescale
    w.u32(segment); // duration
    w.raw(QByteArray(80, '\0'));
    w.end();
    w.begin("trak");
    w.beginFull("tkhd", 0, 7);
    w.u32(0);
    w.u32(0);
    w.u32(1); // track id
    w.u32(0);
    w.u32(segment); // duration
    w.raw(QByteArray(60, '\0'));
    w.end();
    w.begin("edts");
    w.beginFull("elst", 0, 0);
    w.u32(2);
    w.u32(30); // an empty edit first
    w.u32(quint32(-1));
    w.u32(0x10000);
    w.u32(segment - 30);
    w.u32(0);
    w.u32(0x10000);
    w.end();
    w.end();
    w.end();
    w.end();
    return w.data();
}

} // namespace

TEST(Mp4Box, WriterNestsAndReaderFindsBoxesOfEverySize) {
    mp4::Writer w;
    w.begin("moov");
    w.beginFull("mvhd", 1, 0);
    w.u64(42);
    w.end();
    w.begin("trak");
    w.end();
    w.end();
    QByteArray data = w.data();
    // A 64-bit size header, and a box cut short by the end of the data.
    data.append(QByteArray::fromHex("00000001") + "mdat" + QByteArray::fromHex("0000000000000014") +
                QByteArray(4, 'x'));
    data.append(QByteArray::fromHex("000000ff") + "free");

    const auto top = mp4::children(data, 0, data.size());
    ASSERT_EQ(top.size(), 2u);
    EXPECT_EQ(top[0].type, "moov");
    EXPECT_EQ(top[0].end, w.data().size());
    EXPECT_EQ(top[1].type, "mdat");
    EXPECT_EQ(top[1].body - top[1].offset, 16);
    const auto inside = mp4::children(data, top[0]);
    ASSERT_EQ(inside.size(), 2u);
    EXPECT_EQ(mp4::read32(data, inside[0].body), 0x01000000u); // version 1, no flags
    EXPECT_EQ(mp4::read64(data, inside[0].body + 4), 42u);
    ASSERT_TRUE(mp4::find(inside, "trak"));
    EXPECT_EQ(mp4::find(inside, "trak")->end - mp4::find(inside, "trak")->offset, 8);
    EXPECT_FALSE(mp4::find(inside, "udta"));
}

TEST(Mp4Box, ShortenEditsCutsTheLastEditAndTheHeadersOnly) {
    QTemporaryDir dir;
    const QString path = dir.filePath("clip.mp4");
    QFile file(path);
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write(QByteArray::fromHex("00000010") + "ftypisom" + QByteArray(4, '\0'));
    file.write(movieWithEdit(600));
    file.close();

    QString error;
    // One second of 600 asked down to half: the empty edit stays, the played
    // one shrinks, the headers follow.
    ASSERT_TRUE(shortenEdits(path, {MediaTime::make(1, 2)}, &error)) << error.toStdString();
    ASSERT_TRUE(file.open(QIODevice::ReadOnly));
    const QByteArray data = file.readAll();
    file.close();
    const QByteArray expected =
        QByteArray::fromHex("00000010") + "ftypisom" + QByteArray(4, '\0') + movieWithEdit(300);
    // movieWithEdit(300) has the empty edit of 30 and a played edit of 270.
    EXPECT_EQ(data, expected);
    // Asking for more than is there changes nothing.
    ASSERT_TRUE(shortenEdits(path, {MediaTime::make(5, 1)}, &error));
    ASSERT_TRUE(file.open(QIODevice::ReadOnly));
    EXPECT_EQ(file.readAll(), expected);
    file.close();

    const QString text = dir.filePath("notes.txt");
    QFile notes(text);
    ASSERT_TRUE(notes.open(QIODevice::WriteOnly));
    notes.write("no boxes here at all");
    notes.close();
    EXPECT_FALSE(shortenEdits(text, {MediaTime::make(1, 1)}, &error));
    EXPECT_FALSE(error.isEmpty());
}

TEST(Mp4Box, SizesThatClaimMoreThanThereIsStopTheReading) {
    // A 64-bit size past 2^63, which a signed reading turns negative.
    QByteArray huge = QByteArray::fromHex("00000001") + "free" +
                      QByteArray::fromHex("8000000000000010") + QByteArray(16, 'x');
    EXPECT_TRUE(mp4::children(huge, 0, huge.size()).empty());
    // Bounds past the buffer are clipped to it.
    const QByteArray small = QByteArray::fromHex("00000008") + "free";
    EXPECT_EQ(mp4::children(small, -8, 1 << 20).size(), 1u);
    // Reads and writes outside the buffer touch nothing.
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

TEST(Mp4Box, HeadersTooShortForTheirFieldsLeaveTheFileAsItWas) {
    // The movie box with each header in turn cut to a few bytes.
    const QByteArray whole = movieWithEdit(600);
    for (const char* type : {"mvhd", "tkhd", "elst"}) {
        QByteArray damaged;
        // Rebuild with the named box shortened to 10 bytes (2 of contents).
        std::function<void(mp4::Writer&, const QByteArray&, qint64, qint64)> copy =
            [&](mp4::Writer& w, const QByteArray& d, qint64 from, qint64 to) {
                for (const mp4::Box& box : mp4::children(d, from, to)) {
                    if (box.type == type) {
                        w.begin(type);
                        w.u16(0);
                        w.end();
                    } else if (box.type == "moov" || box.type == "trak" || box.type == "edts") {
                        w.begin(box.type.constData());
                        copy(w, d, box.body, box.end);
                        w.end();
                    } else {
                        w.raw(box.bytes(d));
                    }
                }
            };
        mp4::Writer w;
        copy(w, whole, 0, whole.size());
        damaged = w.data();

        QTemporaryDir dir;
        QFile file(dir.filePath("clip.mp4"));
        ASSERT_TRUE(file.open(QIODevice::WriteOnly));
        file.write(damaged);
        file.close();
        QString error;
        EXPECT_FALSE(shortenEdits(file.fileName(), {MediaTime::make(1, 2)}, &error)) << type;
        EXPECT_FALSE(error.isEmpty()) << type;
        ASSERT_TRUE(file.open(QIODevice::ReadOnly));
        EXPECT_EQ(file.readAll(), damaged) << type;
        file.close();
    }
}
