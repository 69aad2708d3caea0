#include "scrubber/ScrubberFixture.h"

#include <QImage>

using testing_support::ScrubberFixture;

namespace {

QImage solid(const QColor& color) {
    QImage image(32, 18, QImage::Format_RGB32);
    image.fill(color);
    return image;
}

} // namespace

class ScrubberThumbnails : public ScrubberFixture {
  protected:
    QColor pixelAt(double seconds) {
        const QImage shot = scrubber->grab().toImage();
        return shot.pixelColor(static_cast<int>(scrubber->positionForTime(seconds)), 19);
    }
};

TEST_F(ScrubberThumbnails, ReloadAsksForAsManyEvenlySpacedStampsAsFitAndRequestsEach) {
    client->aspectRatio = 16.0f / 9.0f;
    scrubber->reloadData();

    // The strip is 400 x 34 points: thumbnails 60.4 wide, so 7 of them.
    ASSERT_GE(client->calls.size(), 3u);
    EXPECT_EQ(client->names().mid(0, 3), (QStringList{"duration", "aspectRatio", "stamps"}));
    const auto asked = client->callsNamed("stamps");
    ASSERT_EQ(asked.size(), 1u);
    EXPECT_EQ(asked[0].count, 7);
    EXPECT_EQ(asked[0].value, 0.0);
    EXPECT_EQ(asked[0].end, 10.0);

    const QList<double> stamps = scrubber->timestamps();
    ASSERT_EQ(stamps.size(), 7);
    for (qsizetype i = 0; i < stamps.size(); ++i)
        EXPECT_NEAR(stamps[i], i * 10.0 / 7.0, 1e-9);
    EXPECT_EQ(client->valuesOf("request"), std::vector<double>(stamps.begin(), stamps.end()));
}

TEST_F(ScrubberThumbnails, ImagesAreShownInTheirSlotsAndStaleOnesIgnored) {
    const QList<double> stamps = scrubber->timestamps();
    ASSERT_EQ(stamps.size(), 12); // square thumbnails, 34 wide
    const double slot = 10.0 / 12.0;
    const QColor empty = pixelAt(stamps[5] + slot / 2);

    scrubber->setThumbnailImage_forTimestamp(solid(Qt::red), stamps[2]);
    scrubber->setThumbnailImage_forTimestamp(solid(Qt::green), 99.0);
    scrubber->setThumbnailImage_forTimestamp(QImage(), stamps[5]);
    EXPECT_EQ(pixelAt(stamps[2] + slot / 2), QColor(Qt::red));
    EXPECT_EQ(pixelAt(stamps[5] + slot / 2), empty);

    // A new movie: answers still on their way for the old stamps are dropped.
    client->duration = 20.0;
    client->clear();
    scrubber->reloadData();
    const QList<double> fresh = scrubber->timestamps();
    EXPECT_EQ(client->valuesOf("request"), std::vector<double>(fresh.begin(), fresh.end()));
    ASSERT_FALSE(fresh.contains(stamps[3]));
    EXPECT_NE(pixelAt(stamps[2] * 2 + slot), QColor(Qt::red)); // old pictures gone
    scrubber->setThumbnailImage_forTimestamp(solid(Qt::blue), stamps[3]);
    EXPECT_NE(pixelAt(stamps[3]), QColor(Qt::blue));
    scrubber->setThumbnailImage_forTimestamp(solid(Qt::blue), fresh[3]);
    EXPECT_EQ(pixelAt(fresh[3] + slot), QColor(Qt::blue));
}

TEST_F(ScrubberThumbnails, ResizingKeepsPicturesItHasAndRequestsOnlyTheNewStamps) {
    scrubber->setThumbnailImage_forTimestamp(solid(Qt::red), 0.0);
    scrubber->resize(220, 38); // 200 points of strip: 6 thumbnails
    const QList<double> stamps = scrubber->timestamps();
    ASSERT_EQ(stamps.size(), 6);
    EXPECT_EQ(client->valuesOf("request"), std::vector<double>(stamps.begin() + 1, stamps.end()));
    EXPECT_EQ(pixelAt(10.0 / 12.0), QColor(Qt::red));
}

TEST_F(ScrubberThumbnails, WithoutAMovieTheStripIsEmptyAndInert) {
    client->duration = std::numeric_limits<double>::quiet_NaN();
    scrubber->reloadData();
    client->clear();
    EXPECT_TRUE(scrubber->timestamps().isEmpty());
    drag(xAt(1.0), xAt(3.0));
    EXPECT_TRUE(client->calls.empty());

    auto gone = std::make_unique<platform::MovieScrubber>();
    gone->setDataSource(std::make_shared<testing_support::RecordingScrubberClient>());
    gone->resize(300, 38);
    gone->reloadData(); // the data source died already: no movie, no crash
    EXPECT_EQ(gone->duration(), 0.0);
}
