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
        return scrubber->grab().toImage().pixelColor(int(scrubber->positionForTime(seconds)), 19);
    }
    std::vector<double> stamps() const {
        const QList<double> list = scrubber->timestamps();
        return {list.begin(), list.end()};
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
    const std::vector<double> seven = stamps();
    ASSERT_EQ(seven.size(), 7u);
    for (std::size_t i = 0; i < 7; ++i)
        EXPECT_NEAR(seven[i], i * 10.0 / 7.0, 1e-9);
    EXPECT_EQ(client->valuesOf("request"), stamps());

    // Resized, it keeps the pictures it has and requests only the new stamps.
    scrubber->setThumbnailImage_forTimestamp(solid(Qt::red), 0.0);
    client->calls.clear();
    scrubber->resize(220, 38); // 200 points of strip: 4 thumbnails
    const std::vector<double> resized = stamps();
    ASSERT_EQ(resized.size(), 4u);
    EXPECT_EQ(client->valuesOf("request"), std::vector<double>(resized.begin() + 1, resized.end()));
    EXPECT_EQ(pixelAt(10.0 / 12.0), QColor(Qt::red));
}

TEST_F(ScrubberThumbnails, ImagesAreShownInTheirSlotsAndStaleOnesIgnored) {
    const std::vector<double> old = stamps();
    ASSERT_EQ(old.size(), 12u); // square thumbnails, 34 wide
    const double slot = 10.0 / 12.0;
    const QColor empty = pixelAt(old[5] + slot / 2);
    scrubber->setThumbnailImage_forTimestamp(solid(Qt::red), old[2]);
    scrubber->setThumbnailImage_forTimestamp(solid(Qt::green), 99.0);
    scrubber->setThumbnailImage_forTimestamp(QImage(), old[5]);
    EXPECT_EQ(pixelAt(old[2] + slot / 2), QColor(Qt::red));
    EXPECT_EQ(pixelAt(old[5] + slot / 2), empty);

    // A new movie: answers still on their way for the old stamps are dropped.
    client->duration = 20.0;
    client->calls.clear();
    scrubber->reloadData();
    const std::vector<double> fresh = stamps();
    EXPECT_EQ(client->valuesOf("request"), fresh);
    ASSERT_EQ(std::count(fresh.begin(), fresh.end(), old[3]), 0);
    EXPECT_NE(pixelAt(old[2] * 2 + slot), QColor(Qt::red)); // old pictures gone
    scrubber->setThumbnailImage_forTimestamp(solid(Qt::blue), old[3]);
    EXPECT_NE(pixelAt(old[3]), QColor(Qt::blue));
    scrubber->setThumbnailImage_forTimestamp(solid(Qt::blue), fresh[3]);
    EXPECT_EQ(pixelAt(fresh[3] + slot), QColor(Qt::blue));
}

TEST_F(ScrubberThumbnails, WithoutAMovieTheStripIsEmptyAndInert) {
    client->duration = std::numeric_limits<double>::quiet_NaN();
    scrubber->reloadData();
    client->calls.clear();
    EXPECT_TRUE(scrubber->timestamps().isEmpty());
    drag(xAt(1.0), xAt(3.0));
    EXPECT_TRUE(client->calls.empty());

    platform::MovieScrubber gone;
    gone.setDataSource(std::make_shared<testing_support::RecordingScrubberClient>());
    gone.resize(300, 38);
    gone.reloadData(); // the data source died already: no movie, no crash
    EXPECT_EQ(gone.duration(), 0.0);
}
