// The window's shortcuts: keys the focused control leaves alone, bindings in
// order, toolbar items pressed as a click presses them.

#include "platform/ui/ShortcutMap.h"
#include "platform/ui/Toolbar.h"
#include "platform/ui/ToolbarItemButton.h"
#include "ui/UiInput.h"

#include <QApplication>
#include <QKeyEvent>
#include <QLineEdit>
#include <gtest/gtest.h>

using namespace platform;
using Item = ToolbarItem::SystemItem;

namespace {

struct Window {
    Window() : root(QRectF(0, 0, 400, 200)) {
        bar = new Toolbar(QRectF(0, 0, 400, 44));
        root.addSubview(bar);
        map = new ShortcutMap(&root);
        root.show();
    }
    // A key as the user types it: to the focused widget, or the window.
    void type(int key, Qt::KeyboardModifiers modifiers = Qt::NoModifier, bool repeat = false) {
        QWidget* target = root.focusWidget() ? root.focusWidget() : &root;
        const QString text = key == Qt::Key_Space ? QStringLiteral(" ") : QString();
        QKeyEvent press(QEvent::KeyPress, key, modifiers, text, repeat);
        QApplication::sendEvent(target, &press);
    }
    View root;
    Toolbar* bar;
    ShortcutMap* map;
};

} // namespace

TEST(UiShortcutMap, BindingsRunInOrderUntilOneActsAndRepeatsOnlyWhereAsked) {
    Window w;
    QStringList ran;
    w.map->bind(QKeySequence(Qt::Key_Space), [&] { return ran.append("first"), false; });
    w.map->bind(QKeySequence(Qt::Key_Space), [&] { return ran.append("second"), true; });
    w.map->bind(QKeySequence(Qt::Key_Space), [&] { return ran.append("third"), true; });
    w.map->bind(
        QKeySequence(Qt::SHIFT | Qt::Key_Right), [&] { return ran.append("step"), true; }, true);

    w.type(Qt::Key_Space);
    EXPECT_EQ(ran, (QStringList{"first", "second"}));
    ran.clear();
    w.type(Qt::Key_Space, Qt::NoModifier, true); // held down: no toggling
    w.type(Qt::Key_Right, Qt::ShiftModifier, true);
    w.type(Qt::Key_Right); // another key altogether
    EXPECT_EQ(ran, QStringList{"step"});
    EXPECT_EQ(w.map->keys(), (QList<QKeySequence>{QKeySequence(Qt::Key_Space),
                                                  QKeySequence(Qt::SHIFT | Qt::Key_Right)}));
}

TEST(UiShortcutMap, TheFocusedControlHasTheFirstWord) {
    Window w;
    int plays = 0, shares = 0, steps = 0;
    auto play = ToolbarItem::systemItem(Item::Play, [&] { ++plays; });
    auto share = ToolbarItem::systemItem(Item::Action, [&] { ++shares; });
    w.bar->setItems({share, play});
    w.map->bind(QKeySequence(Qt::Key_Space),
                [&] { return ShortcutMap::pressToolbarItem(&w.root, play.get()); });
    w.map->bind(QKeySequence(Qt::Key_Right), [&] { return ++steps, true; });

    auto* field = new QLineEdit(&w.root);
    field->show();
    field->setFocus();
    w.type(Qt::Key_Space);
    EXPECT_EQ(plays, 0) << "a text field takes its spaces";

    QWidget* shareButton = w.bar->widgetForItem(share.get());
    shareButton->setFocus();
    w.type(Qt::Key_Right); // a toolbar button leaves the arrows to the window
    EXPECT_EQ(steps, 1);
    EXPECT_EQ(w.root.focusWidget(), shareButton);
    ui_input::key(shareButton, Qt::Key_Space);
    EXPECT_EQ(shares, 1) << "space presses the focused button";
    EXPECT_EQ(plays, 0);

    shareButton->clearFocus();
    w.type(Qt::Key_Space);
    EXPECT_EQ(plays, 1);
}

TEST(UiShortcutMap, AToolbarItemIsPressedOnlyWhereABarShowsItAndWhenEnabled) {
    Window w;
    int saves = 0;
    auto save = ToolbarItem::systemItem(Item::Save, [&] { ++saves; });
    EXPECT_FALSE(ShortcutMap::pressToolbarItem(&w.root, save.get())) << "in no bar";
    w.bar->setItems({save});
    EXPECT_TRUE(ShortcutMap::pressToolbarItem(&w.root, save.get()));
    save->setEnabled(false);
    EXPECT_FALSE(ShortcutMap::pressToolbarItem(&w.root, save.get()));
    save->setEnabled(true);
    w.bar->hide();
    EXPECT_FALSE(ShortcutMap::pressToolbarItem(&w.root, save.get()));
    EXPECT_EQ(saves, 1);
}
