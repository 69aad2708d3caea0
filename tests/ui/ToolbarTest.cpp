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
    Bar() : root(QRectF(0, 0, 400, 200)) {
        bar = new Toolbar(QRectF(0, 0, 400, 44));
        root.addSubview(bar);
        root.show();
    }
    View root;
    Toolbar* bar;
};

} // namespace

TEST(UiToolbar, ReplacingTheListReplacesEveryWidget) {
    Bar b;
    int plays = 0;
    auto play = ToolbarItem::systemItem(Item::Play, [&] { ++plays; });
    auto share = ToolbarItem::systemItem(Item::Action);
    auto flex = ToolbarItem::flexibleSpace();
    auto title = ToolbarItem::customViewItem(new Label(QRectF(0, 0, 120, 17)));

    b.bar->setItems({share, flex, title, flex, play});
    QPointer<QWidget> oldPlay = b.bar->widgetForItem(play.get());
    ASSERT_TRUE(oldPlay);
    EXPECT_EQ(b.bar->widgetForItem(flex.get()), nullptr);
    EXPECT_EQ(b.bar->widgetForItem(title.get()), title->customView());
    EXPECT_EQ(title->customView()->parentWidget(), b.bar);

    b.bar->setItems({flex, play, flex});
    EXPECT_EQ(b.bar->items().size(), 3);
    EXPECT_FALSE(oldPlay && oldPlay->isVisible()) << "the old widget is gone from the bar";
    QWidget* newPlay = b.bar->widgetForItem(play.get());
    ASSERT_NE(newPlay, nullptr);
    EXPECT_NE(newPlay, oldPlay.data());
    EXPECT_EQ(b.bar->widgetForItem(share.get()), nullptr);
    EXPECT_EQ(title->customView()->parentWidget(), nullptr)
        << "a custom view goes back to its item";

    ui_input::tap(newPlay);
    EXPECT_EQ(plays, 1);
}

TEST(UiToolbar, AnItemMayReplaceTheListFromItsOwnAction) {
    Bar b;
    std::shared_ptr<ToolbarItem> play, pause;
    play = ToolbarItem::systemItem(Item::Play, [&] { b.bar->setItems({pause}); });
    pause = ToolbarItem::systemItem(Item::Pause, [&] { b.bar->setItems({play}); });
    b.bar->setItems({play});
    ui_input::tap(b.bar->widgetForItem(play.get()));
    QCoreApplication::processEvents();
    ASSERT_EQ(b.bar->items().size(), 1);
    EXPECT_EQ(b.bar->items().first(), pause);
    ui_input::tap(b.bar->widgetForItem(pause.get()));
    QCoreApplication::processEvents();
    EXPECT_EQ(b.bar->items().first(), play);
}

TEST(UiToolbar, SpacesDivideTheWidthAndItemsKeepTheirOrder) {
    Bar b;
    auto cancel = ToolbarItem::systemItem(Item::Cancel);
    auto save = ToolbarItem::systemItem(Item::Save);
    auto play = ToolbarItem::systemItem(Item::Play);
    auto flex = ToolbarItem::flexibleSpace();
    b.bar->setItems({cancel, flex, play, flex, save});

    const QRect left = b.bar->widgetForItem(cancel.get())->geometry();
    const QRect middle = b.bar->widgetForItem(play.get())->geometry();
    const QRect right = b.bar->widgetForItem(save.get())->geometry();
    EXPECT_LT(left.right(), middle.left());
    EXPECT_LT(middle.right(), right.left());
    EXPECT_NEAR(middle.center().x(), 200, 30) << "two flexible spaces centre the middle item";
    EXPECT_NEAR(right.right(), 400 - 12, 2);

    auto fixed = ToolbarItem::fixedSpace(50);
    b.bar->setItems({play, fixed, save});
    const int gap = b.bar->widgetForItem(save.get())->geometry().left() -
                    b.bar->widgetForItem(play.get())->geometry().right() - 1;
    EXPECT_GE(gap, 50);
}

TEST(UiToolbar, TitlesAreLocalisedAndEveryButtonIsNamedAndReachable) {
    testing_support::ScopedEnv env;
    env.set("LC_ALL", "de_DE.UTF-8");
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

    QWidget* shareButton = b.bar->widgetForItem(share.get());
    EXPECT_EQ(shareButton->accessibleName(), QStringLiteral("Teilen"));
    EXPECT_EQ(b.bar->widgetForItem(play.get())->accessibleName(), QStringLiteral("Wiedergabe"));
    EXPECT_EQ(b.bar->widgetForItem(done.get())->nextInFocusChain(), shareButton);
    EXPECT_EQ(shareButton->nextInFocusChain(), b.bar->widgetForItem(play.get()));
    EXPECT_EQ(shareButton->focusPolicy(), Qt::TabFocus)
        << "a click must not take the focus from where the user's keys go";

    shareButton->setFocus();
    ui_input::key(shareButton, Qt::Key_Space);
    EXPECT_EQ(shares, 1);
}

TEST(UiToolbar, ItemsTakeTheBarsTintUnlessTheyHaveTheirOwn) {
    Bar b;
    auto save = ToolbarItem::systemItem(Item::Save);
    auto cancel = ToolbarItem::systemItem(Item::Cancel);
    cancel->setTintColor(Qt::red);
    b.bar->setItems({cancel, save});
    b.bar->setTintColor(QColor(10, 120, 30));
    auto* saveButton = qobject_cast<ToolbarItemButton*>(b.bar->widgetForItem(save.get()));
    auto* cancelButton = qobject_cast<ToolbarItemButton*>(b.bar->widgetForItem(cancel.get()));
    ASSERT_TRUE(saveButton && cancelButton);
    EXPECT_EQ(saveButton->effectiveTint(), QColor(10, 120, 30));
    EXPECT_EQ(cancelButton->effectiveTint(), QColor(Qt::red));
    // The list a new bar is given is tinted too.
    b.bar->setItems({save});
    EXPECT_EQ(qobject_cast<ToolbarItemButton*>(b.bar->widgetForItem(save.get()))->effectiveTint(),
              QColor(10, 120, 30));
}

TEST(UiToolbar, ReplacingTheListKeepsTheKeyboardWhereItWas) {
    Bar b;
    auto play = ToolbarItem::systemItem(Item::Play);
    auto pause = ToolbarItem::systemItem(Item::Pause);
    auto share = ToolbarItem::systemItem(Item::Action);
    auto title = ToolbarItem::customViewItem(new Label(QRectF(0, 0, 120, 17)));
    b.bar->setItems({play, share});
    b.bar->widgetForItem(play.get())->setFocus();

    b.bar->setItems({pause, share}); // what a press on play does
    EXPECT_EQ(b.root.focusWidget(), b.bar->widgetForItem(pause.get())) << "the same place";
    b.bar->setItems({share, pause});
    EXPECT_EQ(b.root.focusWidget(), b.bar->widgetForItem(pause.get())) << "the same item";
    b.bar->setItems({share, title});
    EXPECT_EQ(b.root.focusWidget(), nullptr) << "a title takes no focus; nor does the next item";

    b.bar->setItems({play, share}); // nothing had the focus: nothing takes it
    EXPECT_EQ(b.root.focusWidget(), nullptr);
}
