#include "platform/ui/Animation.h"
#include "platform/ui/ViewAlpha.h"
#include "platform/ui/ViewHandle.h"
#include "support/Wait.h"
#include "youtube/TXYouTubeActivityProgressOverlay.h"

#include <QCoreApplication>
#include <QPointer>
#include <gtest/gtest.h>

using platform::ActivityIndicator;
using platform::View;
using testing_support::waitUntil;

namespace {

struct Screen {
    Screen() : root(QRectF(0, 0, 320, 480)) {
        root.show();
        overlay = platform::ViewHandle<TXYouTubeActivityProgressOverlay>(
            new TXYouTubeActivityProgressOverlay(QRectF(20, 40, 200, 100)));
        root.addSubview(overlay.get());
    }
    // Plain child views: the dimming layers.
    int dimmingLayers() const {
        int count = 0;
        for (QObject* child : overlay->children())
            if (child->metaObject() == &View::staticMetaObject)
                ++count;
        return count;
    }
    bool spinnerShown() const {
        return overlay->activityIndicator() &&
               overlay->activityIndicator()->parentWidget() == overlay.get();
    }
    View root;
    platform::ViewHandle<TXYouTubeActivityProgressOverlay> overlay;
};

} // namespace

TEST(UiProgressOverlay, ShowingFadesInOnceThenCentresASpinningIndicator) {
    Screen screen;
    screen.overlay->setShowing_animated(true, true);
    screen.overlay->setShowing_animated(true, true);

    EXPECT_TRUE(screen.overlay->isShowing());
    EXPECT_EQ(screen.dimmingLayers(), 1);
    EXPECT_TRUE(platform::Animation::isAnimating(screen.overlay.get()));
    EXPECT_LT(platform::ViewAlpha::presentationAlpha(screen.overlay.get()), 1.0);
    EXPECT_EQ(screen.overlay->activityIndicator(), nullptr);

    ASSERT_TRUE(waitUntil([&] { return screen.spinnerShown(); }));
    ActivityIndicator* spinner = screen.overlay->activityIndicator();
    EXPECT_TRUE(spinner->isAnimating());
    EXPECT_EQ(spinner->style(), ActivityIndicator::Style::WhiteLarge);
    // Centred in the overlay's own bounds, whatever its origin in the screen.
    EXPECT_EQ(spinner->center(), QPointF(100, 50));
    EXPECT_DOUBLE_EQ(platform::ViewAlpha::presentationAlpha(screen.overlay.get()), 1.0);
    EXPECT_EQ(screen.dimmingLayers(), 1);
}

TEST(UiProgressOverlay, ShowingWithoutAnimationStillFadesIn) {
    Screen screen;
    screen.overlay->setShowing_animated(true, false);
    EXPECT_TRUE(platform::Animation::isAnimating(screen.overlay.get()));
    EXPECT_FALSE(screen.spinnerShown());
    EXPECT_TRUE(waitUntil([&] { return screen.spinnerShown(); }));
}

TEST(UiProgressOverlay, StoppingBeforeTheFadeInEndsRemovesNothing) {
    Screen screen;
    screen.overlay->setShowing_animated(true, true);
    screen.overlay->stopActivity();
    EXPECT_TRUE(waitUntil([&] { return screen.spinnerShown(); }));
}

TEST(UiProgressOverlay, StoppingTakesTheSpinnerOffAndKeepsTheDimming) {
    Screen screen;
    screen.overlay->setShowing_animated(true, true);
    ASSERT_TRUE(waitUntil([&] { return screen.spinnerShown(); }));
    QPointer<ActivityIndicator> spinner = screen.overlay->activityIndicator();

    screen.overlay->stopActivity();
    QCoreApplication::sendPostedEvents(nullptr,
                                       QEvent::DeferredDelete); // would delete a dropped spinner
    ASSERT_TRUE(spinner);
    EXPECT_EQ(spinner->parentWidget(), nullptr);
    EXPECT_EQ(screen.overlay->activityIndicator(), spinner.data());
    EXPECT_EQ(screen.dimmingLayers(), 1);
    EXPECT_EQ(screen.overlay->parentWidget(), &screen.root);
}

TEST(UiProgressOverlay, HidingDropsTheSpinnerAtOnceThenLeavesTheSuperview) {
    Screen screen;
    screen.overlay->setShowing_animated(true, true);
    ASSERT_TRUE(waitUntil([&] { return screen.spinnerShown(); }));

    screen.overlay->setShowing_animated(false, true);
    EXPECT_FALSE(screen.overlay->isShowing());
    EXPECT_FALSE(screen.spinnerShown());
    EXPECT_EQ(screen.overlay->parentWidget(), &screen.root);
    ASSERT_TRUE(waitUntil([&] { return screen.overlay->parentWidget() == nullptr; }));

    // The creator's reference is the last one: letting go deletes it.
    QPointer<TXYouTubeActivityProgressOverlay> gone = screen.overlay.get();
    screen.overlay.reset();
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    EXPECT_TRUE(gone.isNull());
}
