#include "overlay/TXFlatVideoOverlayButton.h"

#include <QColor>
#include <gtest/gtest.h>

namespace {

// The colour at a point given in points, unpremultiplied.
QColor at(const QImage& image, QPointF points) {
    const QPoint pixel = (points * image.devicePixelRatio()).toPoint();
    return image.pixelColor(pixel);
}

void expectNear(int actual, double expected, const char* what) {
    EXPECT_NEAR(actual, expected, 2.0) << what;
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
    expectNear(grey.alpha(), 0.96 * 255, "disc alpha");
    expectNear(grey.red(), 0.96 * 255, "disc grey");
    EXPECT_EQ(grey.red(), grey.blue());

    const QColor glyph = at(normal, {40, 40});
    expectNear(glyph.alpha(), 0.3 * 255, "glyph alpha");
    EXPECT_LE(glyph.red(), 2) << "the glyph's own black, with no grey left under it";

    const QImage highlighted = TXFlatVideoOverlayButton::_highlightedButtonImage();
    expectNear(at(highlighted, {40, 40}).alpha(), 0.5 * 255, "highlighted glyph alpha");
    expectNear(at(highlighted, {14, 40}).alpha(), 0.96 * 255, "highlighted disc alpha");
}

TEST(UiFlatOverlayImage, OtherLevelsDrawWithTheirOwnValues) {
    const QImage image =
        TXFlatVideoOverlayButton::_createOverlayImageWithBackgroundWhite_backgroundAlpha_glyphAlpha(
            0.5f, 1.0f, 1.0f);
    const QColor grey = at(image, {14, 40});
    expectNear(grey.alpha(), 255, "opaque disc");
    expectNear(grey.red(), 0.5 * 255, "half grey");
    expectNear(at(image, {40, 40}).alpha(), 255, "opaque glyph");
}

TEST(UiFlatOverlayImage, ImagesAreMadeOnceAndSharedByEveryFlatButton) {
    TXFlatVideoOverlayButton first(2);
    TXFlatVideoOverlayButton second(0);
    using State = platform::Button::State;
    EXPECT_EQ(first.imageForState(State::Normal).cacheKey(),
              second.imageForState(State::Normal).cacheKey());
    EXPECT_EQ(first.imageForState(State::Highlighted).cacheKey(),
              second.imageForState(State::Highlighted).cacheKey());
    EXPECT_NE(first.imageForState(State::Normal).cacheKey(),
              first.imageForState(State::Highlighted).cacheKey());
    EXPECT_EQ(TXFlatVideoOverlayButton::_normalButtonImage().cacheKey(),
              first.imageForState(State::Normal).cacheKey());
    // The button takes the image's size.
    EXPECT_EQ(first.size(), QSize(80, 80));
}
