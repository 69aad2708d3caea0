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
using platform::ViewAlpha::presentationAlpha;
using testing_support::waitUntil;

namespace {

struct Screen {
    Screen() : root(QRectF(0, 0, 320, 480)) {
        root.show();
        root.addSubview(overlay.get());
    }
    // Plain child views: the dimming layers.
    QList<QWidget*> dimmingLayers() const {
        QList<QWidget*> layers;
        for (QObject* child : overlay->children())
            if (child->metaObject() == &View::staticMetaObject)
                layers.append(static_cast<QWidget*>(child));
        return layers;
    }
    bool spinnerShown() const {
        return overlay->activityIndicator() &&
               overlay->activityIndicator()->parentWidget() == overlay.get();
    }
    void deleteDeferred() { QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete); }
    View root;
    platform::ViewHandle<TXYouTubeActivityProgressOverlay> overlay{
        new TXYouTubeActivityProgressOverlay(QRectF(20, 40, 200, 100))};
};

} // namespace

TEST(UiProgressOverlay, ShowingFadesInOnceThenCentresASpinningIndicatorUntilStopped) {
    for (bool animated : {true, false}) {
        SCOPED_TRACE(animated);
        Screen screen;
        screen.overlay->setShowing_animated(true, animated);
        screen.overlay->setShowing_animated(true, animated);
        EXPECT_TRUE(screen.overlay->isShowing());
        EXPECT_EQ(screen.dimmingLayers().size(), 1);
        EXPECT_TRUE(platform::Animation::isAnimating(screen.overlay.get())) << "it always fades";
        EXPECT_LT(presentationAlpha(screen.overlay.get()), 1.0);
        EXPECT_EQ(screen.overlay->activityIndicator(), nullptr);
        screen.overlay->stopActivity(); // before the fade-in ends: removes nothing

        ASSERT_TRUE(waitUntil([&] { return screen.spinnerShown(); }));
        QPointer<ActivityIndicator> spinner = screen.overlay->activityIndicator();
        EXPECT_TRUE(spinner->isAnimating());
        EXPECT_EQ(spinner->style(), ActivityIndicator::Style::WhiteLarge);
        // Centred in the overlay's own bounds, whatever its origin in the screen.
        EXPECT_EQ(spinner->center(), QPointF(100, 50));
        EXPECT_DOUBLE_EQ(presentationAlpha(screen.overlay.get()), 1.0);
        // The window grows: the dimming still covers the screen, the spinner
        // stays in its middle.
        screen.root.setFrame(QRectF(0, 0, 420, 580));
        EXPECT_EQ(screen.overlay->frame(), QRectF(20, 40, 300, 200));
        EXPECT_EQ(View::frameOf(screen.dimmingLayers().value(0)), QRectF(0, 0, 300, 200));
        EXPECT_EQ(spinner->center(), QPointF(150, 100));

        screen.overlay->stopActivity();
        screen.deleteDeferred(); // would delete a dropped spinner
        ASSERT_TRUE(spinner);
        EXPECT_EQ(spinner->parentWidget(), nullptr);
        EXPECT_EQ(screen.overlay->activityIndicator(), spinner.data());
        EXPECT_EQ(screen.dimmingLayers().size(), 1);
        EXPECT_EQ(screen.overlay->parentWidget(), &screen.root);
    }
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
    screen.deleteDeferred();
    EXPECT_TRUE(gone.isNull());
}
