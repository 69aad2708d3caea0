// How the editor looks: screenshots of the real window under Xvfb, taken by
// the automation, compared where the drawing should agree.

#include "EndToEndFixture.h"

#include <QCoreApplication>
#include <QDir>
#include <QImage>
#include <QJsonArray>
#include <QRegion>
#include <QSet>

namespace {

QRect frameOf(const QJsonObject& dump, const QString& name) {
    const QJsonArray f = dump["frames"].toObject()[name].toArray();
    if (f.size() != 4)
        return {};
    return QRect(f[0].toInt(), f[1].toInt(), f[2].toInt(), f[3].toInt());
}

// Where the screenshots go, for a person to look at.
QString shotPath(const QString& name) {
    const QString dir = QCoreApplication::applicationDirPath() + "/../screenshots";
    QDir().mkpath(dir);
    return QDir(dir).filePath(name);
}

// A screenshot the automation took, which shows something.
QImage loadShot(const QString& path) {
    const QImage shot = QImage(path).convertToFormat(QImage::Format_RGB32);
    QSet<QRgb> colours;
    for (int y = 0; y < shot.height(); y += 7)
        for (int x = 0; x < shot.width(); x += 7)
            colours.insert(shot.pixel(x, y));
    EXPECT_GT(colours.size(), 50) << path.toStdString() << " is missing or looks blank";
    return shot;
}

// The largest and the mean difference of a colour channel (0..255) between
// the two pictures over `where`, or all of them when it is empty.
struct Difference {
    int largest = 255;
    double mean = 255;
};
Difference difference(const QImage& a, const QImage& b, QRegion where = {}) {
    const QImage p = a.convertToFormat(QImage::Format_RGB32),
                 q = b.convertToFormat(QImage::Format_RGB32);
    if (where.isEmpty() && (p.size() != q.size() || p.isNull()))
        return {};
    Difference d{0, 0};
    double channels = 0;
    for (const QRect& r : where.isEmpty() ? QRegion(p.rect()) : where)
        for (int y = r.top(); y <= r.bottom(); ++y)
            for (int x = r.left(); x <= r.right(); ++x) {
                const QRgb u = p.pixel(x, y), v = q.pixel(x, y);
                for (const int c : {qRed(u) - qRed(v), qGreen(u) - qGreen(v), qBlue(u) - qBlue(v)})
                    d.largest = std::max(d.largest, std::abs(c)), d.mean += std::abs(c), ++channels;
            }
    d.mean /= std::max(channels, 1.0);
    return d;
}

// Intro and edit mode, shot with the same frame under the bars (they are
// translucent over the movie): the playhead at the same place in both.
const char* kIntroThenEdit = R"(
wait ready
wait frame
drag playhead 2
sleep 0.8
dump
screenshot %1
drag end 6
drag playhead 2
sleep 0.8
dump
screenshot %2
)";

// The bar drawn in both shots agrees outside the items of either list, and
// each pair of items (before, after) looks the same wherever it stands.
void expectBarsAgree(const QImage& a, const QImage& b, const QJsonObject& before,
                     const QJsonObject& after, const QString& bar,
                     const QList<std::pair<QString, QString>>& sameItems) {
    const QRect frame = frameOf(before, bar);
    ASSERT_FALSE(frame.isEmpty()) << bar.toStdString();
    ASSERT_EQ(frame, frameOf(after, bar));
    QRegion background(frame);
    for (const QJsonObject* dump : {&before, &after})
        for (const QJsonValue& item : dump->value(bar).toArray())
            background -= frameOf(*dump, item.toString()).adjusted(-2, -2, 2, 2);
    EXPECT_LE(difference(a, b, background).largest, 4) << bar.toStdString();
    for (const auto& [was, is] : sameItems) {
        const QRect from = frameOf(before, was), to = frameOf(after, is);
        ASSERT_FALSE(from.isEmpty() || to.isEmpty()) << was.toStdString();
        ASSERT_EQ(from.size(), to.size()) << was.toStdString();
        EXPECT_EQ(a.copy(from), b.copy(to)) << was.toStdString() << " and " << is.toStdString();
    }
}

} // namespace

// Screenshots of intro and edit mode in a layout: the wide one, or the
// compact one of a phone held upright.
TEST_F(EndToEnd, TheEditModeToolbarsDrawAsTheIntroOnesWhereTheyAgree) {
    for (const bool wide : {true, false}) {
        const QString layout = wide ? "wide" : "compact";
        SCOPED_TRACE(layout.toStdString());
        const QString intro = shotPath(layout + "-intro.png"),
                      editing = shotPath(layout + "-edit.png");
        bool skipped = false;
        const QString script = QString(kIntroThenEdit).arg(intro, editing);
        const Run run = wide
                            ? editUnderXvfb(script, QSize(1280, 800), {}, {}, &skipped)
                            : editUnderXvfb("resize 480 800\nsleep 0.5\n" + script,
                                            QSize(1280, 1024), {"--device", "phone"}, {}, &skipped);
        if (skipped)
            GTEST_SKIP() << "xvfb-run is not installed";
        ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
        ASSERT_EQ(run.dumps.size(), 2);
        const QJsonObject &before = run.dumps[0], &after = run.dumps[1];
        ASSERT_TRUE(after["trimming"].toBool());
        ASSERT_EQ(after["padMode"].toBool(), wide);
        ASSERT_EQ(before["currentTime"].toDouble(), after["currentTime"].toDouble());
        const QImage a = loadShot(intro), b = loadShot(editing);
        ASSERT_FALSE(a.isNull() || b.isNull());
        QList<std::pair<QString, QString>> topItems = {{"cancelButton", "cancelTrimButton"},
                                                       {"titleButton", "titleButton"}};
        if (wide)
            topItems.append(std::pair<QString, QString>("playButton", "playButton"));
        else
            expectBarsAgree(a, b, before, after, "bottomToolBar",
                            {{"shareButton", "shareButton"}, {"playButton", "playButton"}});
        expectBarsAgree(a, b, before, after, "topToolBar", topItems);
    }
}

TEST_F(EndToEnd, AtTwiceTheDensityGlyphsMasksAndThumbnailsAreDrawnSharp) {
    const QString script = "wait ready\nwait frame\nsleep 0.8\ndump\nscreenshot %1\n";
    QImage shots[2];
    QJsonObject dumps[2];
    for (int i = 0; i < 2; ++i) {
        const int scale = i + 1;
        const QString path = shotPath(QString("editor-scale%1.png").arg(scale));
        QProcessEnvironment env;
        env.insert("QT_SCALE_FACTOR", QString::number(scale));
        bool skipped = false;
        const Run run =
            editUnderXvfb(script.arg(path), QSize(1280, 800) * scale, {}, env, &skipped);
        if (skipped)
            GTEST_SKIP() << "xvfb-run is not installed";
        ASSERT_EQ(run.exitCode, 0) << run.err.toStdString();
        ASSERT_EQ(run.dumps.size(), 1);
        dumps[i] = run.dumps[0];
        shots[i] = loadShot(path);
        ASSERT_FALSE(shots[i].isNull());
    }
    ASSERT_EQ(shots[1].size(), shots[0].size() * 2) << "every point is two pixels a side";

    // Each part at scale 2 must look like itself at scale 1 (the same
    // shapes in the same places: `agree` is the mean channel difference of
    // the halved picture; text and thumbnails are resampled, so they are
    // allowed more), and carry detail that the scale 1 picture blown up does
    // not: it is as far from the blocky and the smooth blow-up as they are
    // from each other, at least by half.
    const struct {
        const char* name;
        double agree;
    } parts[] = {{"shareButton", 3},
                 {"saveButton", 3},
                 {"videoOverlayPlayButton", 3},
                 {"titleButton", 10},
                 {"avTrimmer", 6}};
    for (const auto& part : parts) {
        SCOPED_TRACE(part.name);
        const QRect logical = frameOf(dumps[0], part.name);
        ASSERT_FALSE(logical.isEmpty());
        ASSERT_EQ(frameOf(dumps[1], part.name), logical);
        const QImage one = shots[0].copy(logical);
        const QImage two = shots[1].copy(QRect(logical.topLeft() * 2, logical.size() * 2));
        EXPECT_LE(
            difference(two.scaled(one.size(), Qt::IgnoreAspectRatio, Qt::SmoothTransformation), one)
                .mean,
            part.agree);
        const QImage blocky = one.scaled(two.size(), Qt::IgnoreAspectRatio, Qt::FastTransformation);
        const QImage smooth =
            one.scaled(two.size(), Qt::IgnoreAspectRatio, Qt::SmoothTransformation);
        const double blowUps = difference(blocky, smooth).mean;
        EXPECT_GE(difference(two, blocky).mean, blowUps / 2);
        EXPECT_GE(difference(two, smooth).mean, blowUps / 2);
    }
}
