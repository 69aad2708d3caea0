#include "platform/ui/Animation.h"
#include "platform/ui/View.h"
#include "platform/ui/ViewAlpha.h"
#include "support/Wait.h"
#include "ui/UiInput.h"

#include <gtest/gtest.h>
#include <optional>

using platform::Animation;
using platform::View;
using namespace platform::ViewAlpha;
using testing_support::waitUntil;

TEST(UiAnimation, AlphaTakesItsModelValueAtOnceAndReachesItOnScreen) {
    View view(QRectF(0, 0, 50, 50));
    std::optional<bool> finished;
    Animation::animateWithDuration(
        0.1, [&] { view.setAlpha(0.2); }, [&](bool f) { finished = f; });

    EXPECT_DOUBLE_EQ(view.alpha(), 0.2);
    EXPECT_DOUBLE_EQ(presentationAlpha(&view), 1.0);
    EXPECT_FALSE(finished) << "the completion never runs inside the call";
    ASSERT_TRUE(waitUntil([&] { return finished.has_value(); }));
    EXPECT_TRUE(*finished);
    EXPECT_DOUBLE_EQ(presentationAlpha(&view), 0.2);
}

TEST(UiAnimation, AReplacedAnimationCompletesUnfinishedFromWhereItStood) {
    View view(QRectF(0, 0, 50, 50));
    std::optional<bool> first, second;
    Animation::animateWithDuration(
        5.0, [&] { view.setAlpha(0.0); }, [&](bool f) { first = f; });
    ASSERT_TRUE(waitUntil([&] { return presentationAlpha(&view) < 0.99; }));
    const qreal standing = presentationAlpha(&view);

    Animation::animateWithDuration(
        0.05, [&] { view.setAlpha(1.0); }, [&](bool f) { second = f; });
    EXPECT_NEAR(presentationAlpha(&view), standing, 0.05);
    ASSERT_TRUE(waitUntil([&] { return first && second; }));
    EXPECT_FALSE(*first);
    EXPECT_TRUE(*second);
    EXPECT_DOUBLE_EQ(presentationAlpha(&view), 1.0);
}

TEST(UiAnimation, NothingToAnimateStillCompletesLater) {
    View view(QRectF(0, 0, 50, 50));
    std::optional<bool> finished;
    Animation::animateWithDuration(
        0.2, [&] { view.setAlpha(1.0); }, [&](bool f) { finished = f; });
    EXPECT_FALSE(finished);
    EXPECT_FALSE(Animation::isAnimating(&view));
    ASSERT_TRUE(waitUntil([&] { return finished.has_value(); }));
    EXPECT_TRUE(*finished);

    // An immediate set stops a running animation, which completes unfinished.
    finished.reset();
    Animation::animateWithDuration(
        5.0, [&] { view.setAlpha(0.0); }, [&](bool f) { finished = f; });
    view.setAlpha(0.7);
    EXPECT_DOUBLE_EQ(presentationAlpha(&view), 0.7);
    ASSERT_TRUE(waitUntil([&] { return finished.has_value(); }));
    EXPECT_FALSE(*finished);
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
