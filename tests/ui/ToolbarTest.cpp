#include "platform/ui/Toolbar.h"
#include "platform/ui/Label.h"
#include "platform/ui/ToolbarItemButton.h"
#include "support/TempDir.h"
#include "ui/UiInput.h"

#include <QCoreApplication>
#include <QPointer>
#include <gtest/gtest.h>

using namespace platform;
using Item = ToolbarItem::SystemItem;

namespace {

struct Bar {
    Bar() : root(QRectF(0, 0, 400, 200)), bar(new Toolbar(QRectF(0, 0, 400, 44))) {
        root.addSubview(bar);
        root.show();
    }
    QWidget* widget(const std::shared_ptr<ToolbarItem>& item) const {
        return bar->widgetForItem(item.get());
    }
    View root;
    Toolbar* bar;
};

} // namespace

TEST(UiToolbar, ReplacingTheListReplacesEveryWidgetAlsoFromAnItemsOwnAction) {
    Bar b;
    std::shared_ptr<ToolbarItem> play, pause;
    play = ToolbarItem::systemItem(Item::Play, [&] { b.bar->setItems({pause}); });
    pause = ToolbarItem::systemItem(Item::Pause, [&] { b.bar->setItems({play}); });
    auto share = ToolbarItem::systemItem(Item::Action);
    auto flex = ToolbarItem::flexibleSpace();
    auto title = ToolbarItem::customViewItem(new Label(QRectF(0, 0, 120, 17)));

    b.bar->setItems({share, flex, title, flex, play});
    QPointer<QWidget> oldPlay = b.widget(play);
    ASSERT_TRUE(oldPlay);
    EXPECT_EQ(b.widget(flex), nullptr);
    EXPECT_EQ(b.widget(title), title->customView());
    EXPECT_EQ(title->customView()->parentWidget(), b.bar);

    b.bar->setItems({flex, play, flex});
    EXPECT_EQ(b.bar->items().size(), 3);
    EXPECT_FALSE(oldPlay && oldPlay->isVisible()) << "the old widget is gone from the bar";
    ASSERT_NE(b.widget(play), nullptr);
    EXPECT_NE(b.widget(play), oldPlay.data());
    EXPECT_EQ(b.widget(share), nullptr);
    EXPECT_EQ(title->customView()->parentWidget(), nullptr) << "a custom view goes back";

    ui_input::tap(b.widget(play));
    QCoreApplication::processEvents();
    EXPECT_EQ(b.bar->items(), Toolbar::ItemList{pause});
    ui_input::tap(b.widget(pause));
    QCoreApplication::processEvents();
    EXPECT_EQ(b.bar->items(), Toolbar::ItemList{play});
}

TEST(UiToolbar, SpacesDivideTheWidthAndItemsKeepTheirOrder) {
    Bar b;
    auto cancel = ToolbarItem::systemItem(Item::Cancel);
    auto save = ToolbarItem::systemItem(Item::Save);
    auto play = ToolbarItem::systemItem(Item::Play);
    auto flex = ToolbarItem::flexibleSpace();
    b.bar->setItems({cancel, flex, play, flex, save});
    const QRect left = b.widget(cancel)->geometry();
    const QRect middle = b.widget(play)->geometry();
    const QRect right = b.widget(save)->geometry();
    EXPECT_LT(left.right(), middle.left());
    EXPECT_LT(middle.right(), right.left());
    EXPECT_NEAR(middle.center().x(), 200, 30) << "two flexible spaces centre the middle item";
    EXPECT_NEAR(right.right(), 400 - 12, 2);

    b.bar->setItems({play, ToolbarItem::fixedSpace(50), save});
    EXPECT_GE(b.widget(save)->geometry().left() - b.widget(play)->geometry().right() - 1, 50);
}

TEST(UiToolbar, TitlesAreLocalisedAndEveryButtonIsNamedAndReachable) {
    testing_support::ScopedEnv env("LC_ALL", "de_DE.UTF-8");
    env.set("LANGUAGE", "de");
    Bar b;
    int shares = 0;
    auto done = ToolbarItem::systemItem(Item::Done);
    auto share = ToolbarItem::systemItem(Item::Action, [&] { ++shares; });
    auto play = ToolbarItem::systemItem(Item::Play);
    EXPECT_EQ(done->title(), QStringLiteral("Fertig"));
    EXPECT_FALSE(done->showsIcon());
    EXPECT_TRUE(share->showsIcon());
    b.bar->setItems({done, ToolbarItem::flexibleSpace(), share, play});

    EXPECT_EQ(b.widget(share)->accessibleName(), QStringLiteral("Teilen"));
    EXPECT_EQ(b.widget(play)->accessibleName(), QStringLiteral("Wiedergabe"));
    EXPECT_EQ(b.widget(done)->nextInFocusChain(), b.widget(share));
    EXPECT_EQ(b.widget(share)->nextInFocusChain(), b.widget(play));
    EXPECT_EQ(b.widget(share)->focusPolicy(), Qt::TabFocus)
        << "a click must not take the focus from where the user's keys go";
    b.widget(share)->setFocus();
    ui_input::key(b.widget(share), Qt::Key_Space);
    EXPECT_EQ(shares, 1);
}

TEST(UiToolbar, ItemsTakeTheBarsTintUnlessTheyHaveTheirOwn) {
    Bar b;
    auto save = ToolbarItem::systemItem(Item::Save);
    auto cancel = ToolbarItem::systemItem(Item::Cancel);
    cancel->setTintColor(Qt::red);
    b.bar->setItems({cancel, save});
    b.bar->setTintColor(QColor(10, 120, 30));
    const auto tint = [&](const auto& item) {
        return qobject_cast<ToolbarItemButton*>(b.widget(item))->effectiveTint();
    };
    EXPECT_EQ(tint(save), QColor(10, 120, 30));
    EXPECT_EQ(tint(cancel), QColor(Qt::red));
    b.bar->setItems({save}); // a new list is tinted too
    EXPECT_EQ(tint(save), QColor(10, 120, 30));
}

TEST(UiToolbar, ReplacingTheListKeepsTheKeyboardWhereItWas) {
    Bar b;
    auto play = ToolbarItem::systemItem(Item::Play);
    auto pause = ToolbarItem::systemItem(Item::Pause);
    auto share = ToolbarItem::systemItem(Item::Action);
    auto title = ToolbarItem::customViewItem(new Label(QRectF(0, 0, 120, 17)));
    b.bar->setItems({play, share});
    b.widget(play)->setFocus();

    b.bar->setItems({pause, share}); // what a press on play does
    EXPECT_EQ(b.root.focusWidget(), b.widget(pause)) << "the same place";
    b.bar->setItems({share, pause});
    EXPECT_EQ(b.root.focusWidget(), b.widget(pause)) << "the same item";
    b.bar->setItems({share, title});
    EXPECT_EQ(b.root.focusWidget(), nullptr) << "a title takes no focus; nor does the next item";
    b.bar->setItems({play, share}); // nothing had the focus: nothing takes it
    EXPECT_EQ(b.root.focusWidget(), nullptr);
}

TEST(UiToolbar, ImageInsetsMoveTheIcon) {
    Bar b;
    auto plain = ToolbarItem::systemItem(Item::Play);
    auto moved = ToolbarItem::systemItem(Item::Play);
    moved->setImageInsets(QMarginsF(0, 8, 0, -8)); // left, top, right, bottom
    b.bar->setItems({plain, moved});
    b.bar->setTintColor(Qt::black);
    // The mean row of the icon's ink, in each button's own picture.
    const auto inkRow = [&](const auto& item) {
        QImage image(b.widget(item)->size(), QImage::Format_ARGB32_Premultiplied);
        image.fill(Qt::transparent);
        b.widget(item)->render(&image, QPoint(), QRegion(), QWidget::RenderFlags());
        double sum = 0, count = 0;
        for (int y = 0; y < image.height(); ++y)
            for (int x = 0; x < image.width(); ++x)
                if (qAlpha(image.pixel(x, y)) > 128)
                    sum += y, ++count;
        return count > 0 ? sum / count : -1.0;
    };
    ASSERT_GT(inkRow(plain), 0);
    EXPECT_NEAR(inkRow(moved) - inkRow(plain), 8.0, 1.0);
}
