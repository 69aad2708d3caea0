#include "platform/services/Bundle.h"
#include "platform/ui/ImageContext.h"
#include "platform/ui/NamedImage.h"

#include <gtest/gtest.h>

using namespace platform;

TEST(UiImages, NamedImagesComeInTheVariantOfTheScale) {
    const auto bundle = Bundle::bundleWithPath("/System/Library/Frameworks/Tamsel.framework");
    ASSERT_TRUE(bundle);
    const auto glyph = [&](qreal scale, const QString& name = "TXVideoOverlayGlyphMask") {
        return NamedImage::imageNamed(name, bundle.get(), scale);
    };
    for (int scale : {1, 2, 3}) {
        ASSERT_FALSE(glyph(scale).isNull());
        EXPECT_EQ(glyph(scale).devicePixelRatio(), scale);
        EXPECT_EQ(glyph(scale).width(), 80 * scale);
        EXPECT_EQ(glyph(scale).deviceIndependentSize(), QSizeF(80, 80));
    }
    EXPECT_EQ(glyph(1.5).devicePixelRatio(), 2) << "between variants the larger one serves";
    EXPECT_TRUE(glyph(2, "NoSuchImage").isNull());
    EXPECT_TRUE(NamedImage::imageNamed("TXVideoOverlayGlyphMask", nullptr, 2).isNull());
}

TEST(UiImages, OffscreenDrawingBlendsAtTheContextsScale) {
    ImageContext context(QSizeF(10, 10), false, 2.0);
    context.fillRect(QRectF(0, 0, 10, 10), 0.5, 1.0);
    QImage punch(4, 4, QImage::Format_ARGB32_Premultiplied); // 2 x 2 points at scale 2
    punch.fill(Qt::black);
    punch.setDevicePixelRatio(2.0);
    context.drawImage(punch, QPointF(0, 0), BlendMode::DestinationOut, 1.0);
    context.drawImage(punch, QPointF(5, 5), BlendMode::Normal, 0.5);

    const QImage image = context.image();
    EXPECT_EQ(image.size(), QSize(20, 20));
    EXPECT_EQ(image.devicePixelRatio(), 2.0);
    EXPECT_EQ(image.pixelColor(1, 1).alpha(), 0) << "destination-out cleared the grey";
    EXPECT_EQ(image.pixelColor(3, 3).alpha(), 0);
    EXPECT_EQ(image.pixelColor(4, 4).alpha(), 255) << "the punched image is 2 points, 4 pixels";
    EXPECT_NEAR(image.pixelColor(6, 6).red(), 128, 2);
    EXPECT_NEAR(image.pixelColor(11, 11).red(), 64, 2) << "black at half over grey";
    EXPECT_EQ(image.pixelColor(11, 11).alpha(), 255);
    EXPECT_TRUE(ImageContext(QSizeF(0, 0), false, 2.0).image().isNull());
}
