#include "platform/ui/Animation.h"
#include "platform/ui/View.h"
#include "platform/ui/ViewAlpha.h"
#include "support/Wait.h"

#include <gtest/gtest.h>
#include <optional>

using platform::Animation;
using platform::View;
using platform::ViewAlpha::presentationAlpha;
using testing_support::waitUntil;

namespace {
// Animates the view's alpha to `to`; `finished` gets the completion's value.
void fade(View& view, double seconds, qreal to, std::optional<bool>& finished) {
    finished.reset();
    Animation::animateWithDuration(
        seconds, [&view, to] { view.setAlpha(to); }, [&finished](bool f) { finished = f; });
}
} // namespace

TEST(UiAnimation, AlphaTakesItsModelValueAtOnceAndReachesItOnScreenCompletingLater) {
    View view(QRectF(0, 0, 50, 50));
    std::optional<bool> finished;
    fade(view, 0.1, 0.2, finished);
    EXPECT_DOUBLE_EQ(view.alpha(), 0.2);
    EXPECT_DOUBLE_EQ(presentationAlpha(&view), 1.0);
    EXPECT_FALSE(finished) << "the completion never runs inside the call";
    ASSERT_TRUE(waitUntil([&] { return finished.has_value(); }));
    EXPECT_TRUE(*finished);
    EXPECT_DOUBLE_EQ(presentationAlpha(&view), 0.2);

    // Nothing to animate still completes later.
    fade(view, 0.2, 0.2, finished);
    EXPECT_FALSE(finished);
    EXPECT_FALSE(Animation::isAnimating(&view));
    ASSERT_TRUE(waitUntil([&] { return finished.has_value(); }));
    EXPECT_TRUE(*finished);
}

TEST(UiAnimation, AReplacedOrOverriddenAnimationCompletesUnfinished) {
    View view(QRectF(0, 0, 50, 50));
    std::optional<bool> first, second;
    fade(view, 5.0, 0.0, first);
    ASSERT_TRUE(waitUntil([&] { return presentationAlpha(&view) < 0.99; }));
    const qreal standing = presentationAlpha(&view);
    fade(view, 0.05, 1.0, second);
    EXPECT_NEAR(presentationAlpha(&view), standing, 0.05) << "from where it stood";
    ASSERT_TRUE(waitUntil([&] { return first && second; }));
    EXPECT_FALSE(*first);
    EXPECT_TRUE(*second);
    EXPECT_DOUBLE_EQ(presentationAlpha(&view), 1.0);

    // An immediate set stops a running animation.
    fade(view, 5.0, 0.0, first);
    view.setAlpha(0.7);
    EXPECT_DOUBLE_EQ(presentationAlpha(&view), 0.7);
    ASSERT_TRUE(waitUntil([&] { return first.has_value(); }));
    EXPECT_FALSE(*first);
}

TEST(UiAnimation, AnInvisibleViewLetsPressesThrough) {
    View root(QRectF(0, 0, 100, 100));
    auto* cover = new View(QRectF(0, 0, 100, 100));
    root.addSubview(cover);
    root.show();
    cover->setAlpha(0.0);
    EXPECT_TRUE(cover->testAttribute(Qt::WA_TransparentForMouseEvents));
    EXPECT_EQ(root.childAt(50, 50), nullptr);
    cover->setAlpha(1.0);
    EXPECT_FALSE(cover->testAttribute(Qt::WA_TransparentForMouseEvents));
    EXPECT_EQ(root.childAt(50, 50), cover);

    // Interaction switched off while invisible stays off when it shows again.
    cover->setAlpha(0.0);
    cover->setUserInteractionEnabled(false);
    cover->setAlpha(1.0);
    EXPECT_FALSE(cover->isUserInteractionEnabled());
    EXPECT_EQ(root.childAt(50, 50), nullptr);
}
