#include "overlay/TXFlatVideoOverlayButton.h"

#include <QColor>
#include <gtest/gtest.h>

namespace {
// The colour at a point given in points, unpremultiplied.
QColor at(const QImage& image, QPointF points) {
    return image.pixelColor((points * image.devicePixelRatio()).toPoint());
}
} // namespace

// Points chosen on the drawn masks (80 x 80 points): the corner is outside
// the disc, (14, 40) inside the disc and off the glyph, (40, 40) inside the
// play triangle.
TEST(UiFlatOverlayImage, GreyDiscWithTheGlyphKnockedOutAndDrawnBackAtItsAlpha) {
    const QImage normal = TXFlatVideoOverlayButton::_normalButtonImage();
    ASSERT_FALSE(normal.isNull());
    EXPECT_EQ(normal.deviceIndependentSize(), QSizeF(80, 80));
    EXPECT_EQ(at(normal, {2, 2}).alpha(), 0) << "outside the disc";
    const QColor grey = at(normal, {14, 40});
    EXPECT_NEAR(grey.alpha(), 0.96 * 255, 2);
    EXPECT_NEAR(grey.red(), 0.96 * 255, 2);
    EXPECT_EQ(grey.red(), grey.blue());
    EXPECT_NEAR(at(normal, {40, 40}).alpha(), 0.3 * 255, 2);
    EXPECT_LE(at(normal, {40, 40}).red(), 2) << "the glyph's own black, with no grey under it";

    const QImage highlighted = TXFlatVideoOverlayButton::_highlightedButtonImage();
    EXPECT_NEAR(at(highlighted, {40, 40}).alpha(), 0.5 * 255, 2);
    EXPECT_NEAR(at(highlighted, {14, 40}).alpha(), 0.96 * 255, 2);

    const QImage other =
        TXFlatVideoOverlayButton::_createOverlayImageWithBackgroundWhite_backgroundAlpha_glyphAlpha(
            0.5f, 1.0f, 1.0f);
    EXPECT_NEAR(at(other, {14, 40}).alpha(), 255, 2);
    EXPECT_NEAR(at(other, {14, 40}).red(), 0.5 * 255, 2);
    EXPECT_NEAR(at(other, {40, 40}).alpha(), 255, 2);
}
