#include "platform/services/Bundle.h"
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
