#include "platform/ui/Label.h"
#include "platform/ui/Toolbar.h"
#include "platform/ui/View.h"
#include "platform/ui/ViewHandle.h"
#include "support/Wait.h"

#include <gtest/gtest.h>

using namespace platform;
using testing_support::waitUntil;

TEST(UiLayout, ConstraintsFollowTheViewsTheyReferToAccumulateAndGoWithARemovedView) {
    // A root view with a bottom bar and a strip placed on it by constraints,
    // as a compact layout does.
    View root(QRectF(0, 0, 400, 300));
    ViewHandle<Toolbar> bar(new Toolbar(QRectF(0, 256, 400, 44)));
    root.addSubview(bar.get());
    auto* strip = new View();
    strip->setTranslatesAutoresizingMaskIntoConstraints(false);
    root.addSubview(strip);
    using A = LayoutAttribute;
    const auto stripAbove = [&](View* view, A edge) {
        return QList<LayoutConstraint>{
            LayoutConstraint::make(strip, A::Leading, &root, A::Leading),
            LayoutConstraint::make(strip, A::Trailing, &root, A::Trailing),
            LayoutConstraint::make(strip, A::Bottom, view, edge),
            LayoutConstraint::constantSize(strip, A::Height, 38)};
    };
    root.addConstraints(stripAbove(bar.get(), A::Top));
    root.layoutIfNeeded();
    EXPECT_EQ(strip->frame(), QRectF(0, 218, 400, 38));
    bar->setFrame(QRectF(0, 200, 400, 44));
    ASSERT_TRUE(waitUntil([&] { return strip->frame().bottom() == 200; }));
    root.setFrame(QRectF(0, 0, 600, 300));
    ASSERT_TRUE(waitUntil([&] { return strip->frame().width() == 600; }));

    root.setFrame(QRectF(0, 0, 400, 300));
    bar->setFrame(QRectF(0, 256, 400, 44));
    root.addConstraints(stripAbove(&root, A::Bottom));
    EXPECT_EQ(root.constraints().size(), 8);
    root.layoutIfNeeded();
    EXPECT_EQ(strip->frame().bottom(), 300) << "the constraint added last wins";
    bar->removeFromSuperview();
    EXPECT_EQ(root.constraints().size(), 7);
    root.layoutIfNeeded();
    EXPECT_EQ(strip->frame(), QRectF(0, 262, 400, 38));

    // Back in, the bar's constraints come again and, added last, win.
    ASSERT_TRUE(bar) << "the handle keeps the removed bar";
    root.addSubview(bar.get());
    root.addConstraints(stripAbove(bar.get(), A::Top));
    EXPECT_EQ(root.constraints().size(), 11);
    root.layoutIfNeeded();
    EXPECT_EQ(strip->frame(), QRectF(0, 218, 400, 38));
}

TEST(UiLayout, AutoresizingSharesTheChangeAmongFlexibleParts) {
    View root(QRectF(0, 0, 400, 300));
    auto* bar = new View(QRectF(0, 256, 400, 44));
    bar->setAutoresizingMask(View::FlexibleWidth | View::FlexibleTopMargin);
    auto* centred = new View(QRectF(160, 110, 80, 80));
    centred->setAutoresizingMask(View::FlexibleLeftMargin | View::FlexibleRightMargin |
                                 View::FlexibleTopMargin | View::FlexibleBottomMargin);
    auto* pinned = new View(QRectF(10, 10, 20, 20));
    for (View* view : {bar, centred, pinned})
        root.addSubview(view);
    root.setFrame(QRectF(0, 0, 800, 500));
    EXPECT_EQ(bar->frame(), QRectF(0, 456, 800, 44));
    EXPECT_EQ(centred->frame(), QRectF(360, 210, 80, 80));
    EXPECT_EQ(pinned->frame(), QRectF(10, 10, 20, 20));
}

TEST(UiLayout, AnUnclippedViewShowsSubviewsBeyondItsFrame) {
    View root(QRectF(0, 0, 300, 100));
    auto* title = new Label(QRectF(10, 10, 120, 17));
    title->setClipsToBounds(false);
    title->addSubview(new Label(QRectF(0, 17, 120, 17)));
    root.addSubview(title);
    EXPECT_EQ(title->frame(), QRectF(10, 10, 120, 17));
    EXPECT_GE(title->height(), 34) << "the widget holds the line beneath";

    auto* clipped = new Label(QRectF(10, 50, 120, 17));
    clipped->addSubview(new Label(QRectF(0, 17, 120, 17)));
    root.addSubview(clipped);
    EXPECT_EQ(clipped->height(), 17);
}
