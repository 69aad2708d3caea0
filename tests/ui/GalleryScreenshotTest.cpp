#include <QImage>
#include <QProcess>
#include <QSet>
#include <QTemporaryDir>
#include <gtest/gtest.h>

// The gallery in a real X server (Xvfb): its window is saved and must show
// something, not one flat colour.
TEST(UiGalleryScreenshot, TheGalleryWindowIsNotBlank) {
    QTemporaryDir directory;
    ASSERT_TRUE(directory.isValid());
    const QString file = directory.filePath(QStringLiteral("gallery.png"));

    QProcess gallery;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(QStringLiteral("QT_QPA_PLATFORM"), QStringLiteral("xcb"));
    gallery.setProcessEnvironment(environment);
    gallery.setProcessChannelMode(QProcess::MergedChannels);
    gallery.start(QStringLiteral(TAMSEL_XVFB_RUN),
                  {QStringLiteral("-a"), QStringLiteral("-s"),
                   QStringLiteral("-screen 0 1280x1024x24"), QStringLiteral(TAMSEL_GALLERY),
                   QStringLiteral("--screenshot"), file});
    ASSERT_TRUE(gallery.waitForFinished(90000)) << "the gallery did not finish";
    ASSERT_EQ(gallery.exitStatus(), QProcess::NormalExit);
    ASSERT_EQ(gallery.exitCode(), 0) << gallery.readAll().toStdString();

    QImage image(file);
    ASSERT_FALSE(image.isNull()) << "no screenshot at " << file.toStdString();
    EXPECT_GE(image.width(), 800);
    EXPECT_GE(image.height(), 600);

    QSet<QRgb> colours;
    for (int y = 0; y < image.height(); y += 3)
        for (int x = 0; x < image.width(); x += 3)
            colours.insert(image.pixel(x, y));
    EXPECT_GT(colours.size(), 200) << "a window of real controls has many colours";

    // Both halves of the window have content: the picture left, the
    // publishing panel right.
    const auto distinct = [&](QRect area) {
        QSet<QRgb> seen;
        for (int y = area.top(); y <= area.bottom(); y += 2)
            for (int x = area.left(); x <= area.right(); x += 2)
                seen.insert(image.pixel(x, y));
        return seen.size();
    };
    EXPECT_GT(distinct(QRect(0, image.height() / 4, image.width() / 2, image.height() / 2)), 50);
    EXPECT_GT(distinct(QRect(image.width() / 2, image.height() / 4, image.width() / 2,
                             image.height() / 2)),
              3);
}
