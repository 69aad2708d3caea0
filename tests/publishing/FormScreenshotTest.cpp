#include <QImage>
#include <QProcess>
#include <QSet>
#include <QTemporaryDir>
#include <gtest/gtest.h>

namespace {

int distinctColours(const QImage& image, const QRect& area) {
    QSet<QRgb> seen;
    for (int y = area.top(); y <= area.bottom(); y += 2)
        for (int x = area.left(); x <= area.right(); x += 2)
            seen.insert(image.pixel(x, y));
    return int(seen.size());
}

double meanLightness(const QImage& image) {
    double sum = 0;
    int count = 0;
    for (int y = 0; y < image.height(); y += 4)
        for (int x = 0; x < image.width(); x += 4, ++count)
            sum += QColor(image.pixel(x, y)).lightnessF();
    return count ? sum / count : 0;
}

} // namespace

// The upload form in a real X server (Xvfb): pre-filled, then publishing under
// the progress overlay. Both pictures are kept when TAMSEL_SCREENSHOT_DIR
// names a folder.
TEST(PublishingFormScreenshot, TheFormShowsItsFieldsAndDimsUnderTheProgressOverlay) {
    QTemporaryDir temporary;
    const QString dir = qEnvironmentVariableIsEmpty("TAMSEL_SCREENSHOT_DIR")
                            ? temporary.path()
                            : qEnvironmentVariable("TAMSEL_SCREENSHOT_DIR");
    QProcess program;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(QStringLiteral("QT_QPA_PLATFORM"), QStringLiteral("xcb"));
    program.setProcessEnvironment(environment);
    program.setProcessChannelMode(QProcess::MergedChannels);
    program.start(QStringLiteral(TAMSEL_XVFB_RUN), {QStringLiteral("-a"), QStringLiteral("-s"),
                                                    QStringLiteral("-screen 0 1024x768x24"),
                                                    QStringLiteral(TAMSEL_SCREENSHOTS), dir});
    ASSERT_TRUE(program.waitForFinished(90000)) << "the program did not finish";
    ASSERT_EQ(program.exitCode(), 0) << program.readAll().toStdString();

    const QImage form(dir + QStringLiteral("/form.png"));
    const QImage publishing(dir + QStringLiteral("/publishing.png"));
    ASSERT_FALSE(form.isNull());
    ASSERT_FALSE(publishing.isNull());
    EXPECT_GE(form.width(), 500);
    // Text and controls all down the form, not an empty page.
    for (int band = 0; band < 3; ++band)
        EXPECT_GT(distinctColours(
                      form, QRect(0, form.height() * band / 4, form.width(), form.height() / 4)),
                  20)
            << "band " << band;
    EXPECT_LT(meanLightness(publishing), meanLightness(form) * 0.75)
        << "the overlay dims the form while it publishes";
}
