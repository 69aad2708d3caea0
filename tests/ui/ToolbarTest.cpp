#include "platform/ui/Toolbar.h"
#include "platform/ui/Label.h"
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
