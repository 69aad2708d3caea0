#include "scrubber/ScrubberFixture.h"

#include <QImage>
#include <QPainter>
#include <algorithm>

using testing_support::ScrubberFixture;

namespace {

// A made-up frame for the stamp: a colour that walks round the hue circle
// over the movie, with a lighter band so the strip reads as pictures.
QColor colourOf(double seconds) {
    return QColor::fromHsvF(float(seconds / 10.0 * 0.8), 0.7f, 0.8f);
}

QImage frameAt(double seconds) {
    QImage image(160, 90, QImage::Format_RGB32);
    image.fill(colourOf(seconds));
    QPainter painter(&image);
    painter.fillRect(QRect(0, 60, 160, 30), colourOf(seconds).lighter(150));
    return image;
}

} // namespace

class ScrubberRendering : public ScrubberFixture {
  protected:
    // The scrubber drawn at twice the density, as on a HiDPI screen; saved
    // for looking at when TAMSEL_SCRUBBER_PNG names a file.
    QImage render(const QString& suffix) {
        QImage image(scrubber->size() * 2, QImage::Format_ARGB32_Premultiplied);
        image.setDevicePixelRatio(2.0);
        image.fill(QColor(20, 20, 22));
        scrubber->render(&image);
        const QString path = qEnvironmentVariable("TAMSEL_SCRUBBER_PNG");
        if (!path.isEmpty())
            image.save(QString(path).replace(".png", suffix + ".png"));
        return image;
    }
    static QColor at(const QImage& image, double x, double y) {
        return image.pixelColor(int(x * 2), int(y * 2));
    }
};

TEST_F(ScrubberRendering, EditingFramesTheRangeInTheTintAndShadesTheRest) {
    client->aspectRatio = 16.0f / 9.0f;
    scrubber->setEditable(true);
    scrubber->reloadData();
    for (double stamp : scrubber->timestamps())
        scrubber->setThumbnailImage_forTimestamp(frameAt(stamp), stamp);
    scrubber->setStartValue(2.0);
    scrubber->setEndValue(7.0);
    scrubber->setValue(4.0);

    const QImage resting = render("-resting");
    scrubber->setEditing_animated(true, false);
    const QImage editing = render("-editing");

    const QColor tint = scrubber->tintColor();
    EXPECT_EQ(at(editing, xAt(2.0) - 5, 5), tint);           // start handle
    EXPECT_EQ(at(editing, xAt(7.0) + 5, 33), tint);          // end handle
    EXPECT_EQ(at(editing, xAt(5.5), 0.75), tint);            // top bar
    EXPECT_NE(at(resting, xAt(5.5), 0.75), tint);            // no bar at rest
    EXPECT_EQ(at(editing, xAt(4.0), 19), QColor(Qt::white)); // playhead

    // Inside the range the picture shows as it is; outside it is shaded.
    const QList<double> stamps = scrubber->timestamps();
    auto slotColour = [&](double t) {
        return colourOf(*std::prev(std::upper_bound(stamps.begin(), stamps.end(), t))).rgb();
    };
    EXPECT_EQ(at(editing, xAt(5.5), 8).rgb(), slotColour(5.5));
    const QColor shaded = at(editing, xAt(8.9), 8);
    const QColor plain = QColor::fromRgb(slotColour(8.9));
    EXPECT_LT(shaded.value(), plain.value() / 2 + 2);
    EXPECT_LT(at(resting, xAt(8.9), 8).value(), plain.value());
}
