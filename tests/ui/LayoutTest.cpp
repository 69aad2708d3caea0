#include "platform/ui/Label.h"
#include "platform/ui/Toolbar.h"
#include "platform/ui/View.h"
#include "platform/ui/ViewHandle.h"
#include "support/Wait.h"

#include <gtest/gtest.h>

using namespace platform;
using testing_support::waitUntil;

namespace {

// A root view with a bottom bar and a strip placed on it by constraints, as
// a compact layout does.
struct Layout {
    Layout() : root(QRectF(0, 0, 400, 300)) {
        bar = ViewHandle<Toolbar>(new Toolbar(QRectF(0, 256, 400, 44)));
        root.addSubview(bar.get());
        strip = new View();
        strip->setTranslatesAutoresizingMaskIntoConstraints(false);
        root.addSubview(strip);
    }
    QList<LayoutConstraint> onBar() {
        return {
            LayoutConstraint::make(strip, LayoutAttribute::Leading, &root,
                                   LayoutAttribute::Leading),
            LayoutConstraint::make(strip, LayoutAttribute::Trailing, &root,
                                   LayoutAttribute::Trailing),
            LayoutConstraint::make(strip, LayoutAttribute::Bottom, bar.get(), LayoutAttribute::Top),
            LayoutConstraint::constantSize(strip, LayoutAttribute::Height, 38)};
    }
    QList<LayoutConstraint> onRootBottom() {
        QList<LayoutConstraint> list = onBar();
        list[2] =
            LayoutConstraint::make(strip, LayoutAttribute::Bottom, &root, LayoutAttribute::Bottom);
        return list;
    }
    View root;
    ViewHandle<Toolbar> bar;
    View* strip;
};

} // namespace

TEST(UiLayout, ConstraintsPlaceTheViewAndFollowTheViewsTheyReferTo) {
    Layout layout;
    layout.root.addConstraints(layout.onBar());
    layout.root.layoutIfNeeded();
    EXPECT_EQ(layout.strip->frame(), QRectF(0, 218, 400, 38));

    layout.bar->setFrame(QRectF(0, 200, 400, 44));
    ASSERT_TRUE(waitUntil([&] { return layout.strip->frame().bottom() == 200; }));
    layout.root.setFrame(QRectF(0, 0, 600, 300));
    ASSERT_TRUE(waitUntil([&] { return layout.strip->frame().width() == 600; }));
}

TEST(UiLayout, ConstraintsAccumulateAndThoseOnARemovedViewGoWithIt) {
    Layout layout;
    layout.root.addConstraints(layout.onBar());
    layout.root.addConstraints(layout.onRootBottom());
    EXPECT_EQ(layout.root.constraints().size(), 8);
    layout.root.layoutIfNeeded();
    EXPECT_EQ(layout.strip->frame().bottom(), 300) << "the constraint added last wins";

    layout.bar->removeFromSuperview();
    EXPECT_EQ(layout.root.constraints().size(), 7);
    layout.root.layoutIfNeeded();
    EXPECT_EQ(layout.strip->frame(), QRectF(0, 262, 400, 38));

    // Back in, the bar's constraints come again and, added last, win.
    ASSERT_TRUE(layout.bar) << "the handle keeps the removed bar";
    layout.root.addSubview(layout.bar.get());
    layout.root.addConstraints(layout.onBar());
    EXPECT_EQ(layout.root.constraints().size(), 11);
    layout.root.layoutIfNeeded();
    EXPECT_EQ(layout.strip->frame(), QRectF(0, 218, 400, 38));
}

TEST(UiLayout, AutoresizingSharesTheChangeAmongFlexibleParts) {
    View root(QRectF(0, 0, 400, 300));
    auto* bar = new View(QRectF(0, 256, 400, 44));
    bar->setAutoresizingMask(View::FlexibleWidth | View::FlexibleTopMargin);
    auto* centred = new View(QRectF(160, 110, 80, 80));
    centred->setAutoresizingMask(View::FlexibleLeftMargin | View::FlexibleRightMargin |
                                 View::FlexibleTopMargin | View::FlexibleBottomMargin);
    auto* pinned = new View(QRectF(10, 10, 20, 20));
    root.addSubview(bar);
    root.addSubview(centred);
    root.addSubview(pinned);

    root.setFrame(QRectF(0, 0, 800, 500));
    EXPECT_EQ(bar->frame(), QRectF(0, 456, 800, 44));
    EXPECT_EQ(centred->frame(), QRectF(360, 210, 80, 80));
    EXPECT_EQ(pinned->frame(), QRectF(10, 10, 20, 20));
}

TEST(UiLayout, AnUnclippedViewShowsSubviewsBeyondItsFrame) {
    View root(QRectF(0, 0, 300, 100));
    auto* title = new Label(QRectF(10, 10, 120, 17));
    title->setClipsToBounds(false);
    auto* below = new Label(QRectF(0, 17, 120, 17));
    title->addSubview(below);
    root.addSubview(title);

    EXPECT_EQ(title->frame(), QRectF(10, 10, 120, 17));
    EXPECT_GE(title->height(), 34) << "the widget holds the line beneath";

    auto* clipped = new Label(QRectF(10, 50, 120, 17));
    clipped->addSubview(new Label(QRectF(0, 17, 120, 17)));
    root.addSubview(clipped);
    EXPECT_EQ(clipped->height(), 17);
}
