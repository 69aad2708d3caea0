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
    const QString file = directory.filePath("gallery.png");
    QProcess gallery;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert("QT_QPA_PLATFORM", "xcb");
    gallery.setProcessEnvironment(environment);
    gallery.setProcessChannelMode(QProcess::MergedChannels);
    gallery.start(TAMSEL_XVFB_RUN,
                  {"-a", "-s", "-screen 0 1280x1024x24", TAMSEL_GALLERY, "--screenshot", file});
    ASSERT_TRUE(gallery.waitForFinished(90000)) << "the gallery did not finish";
    ASSERT_EQ(gallery.exitStatus(), QProcess::NormalExit);
    ASSERT_EQ(gallery.exitCode(), 0) << gallery.readAll().toStdString();

    const QImage image(file);
    ASSERT_FALSE(image.isNull()) << "no screenshot at " << file.toStdString();
    EXPECT_GE(image.width(), 800);
    EXPECT_GE(image.height(), 600);
    const auto distinct = [&](QRect area) {
        QSet<QRgb> seen;
        for (int y = area.top(); y <= area.bottom(); y += 3)
            for (int x = area.left(); x <= area.right(); x += 3)
                seen.insert(image.pixel(x, y));
        return seen.size();
    };
    const int w = image.width(), h = image.height();
    EXPECT_GT(distinct(image.rect()), 200) << "a window of real controls has many colours";
    // Both halves have content: the picture left, the publishing panel right.
    EXPECT_GT(distinct(QRect(0, h / 4, w / 2, h / 2)), 50);
    EXPECT_GT(distinct(QRect(w / 2, h / 4, w / 2, h / 2)), 3);
}
