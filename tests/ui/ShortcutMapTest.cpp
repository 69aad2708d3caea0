// The window's shortcuts: keys the focused control leaves alone, bindings in
// order, toolbar items pressed as a click presses them.

#include "platform/ui/ShortcutMap.h"
#include "platform/ui/Toolbar.h"

#include <QApplication>
#include <QKeyEvent>
#include <QLineEdit>
#include <gtest/gtest.h>

using namespace platform;
using Item = ToolbarItem::SystemItem;

namespace {

struct Window {
    Window() : root(QRectF(0, 0, 400, 200)), bar(new Toolbar(QRectF(0, 0, 400, 44))) {
        root.addSubview(bar);
        map = new ShortcutMap(&root);
        root.show();
    }
    // A key as the user types it: to the focused widget, or the window.
    void type(int key, Qt::KeyboardModifiers modifiers = Qt::NoModifier, bool repeat = false) {
        const QString text = key == Qt::Key_Space ? QStringLiteral(" ") : QString();
        QKeyEvent press(QEvent::KeyPress, key, modifiers, text, repeat);
        QApplication::sendEvent(root.focusWidget() ? root.focusWidget() : &root, &press);
    }
    View root;
    Toolbar* bar;
    ShortcutMap* map;
};

} // namespace

TEST(UiShortcutMap, BindingsRunInOrderUntilOneActsAndRepeatsOnlyWhereAsked) {
    Window w;
    QStringList ran;
    for (auto [name, acts] : {std::pair{"first", false}, {"second", true}, {"third", true}})
        w.map->bind(QKeySequence(Qt::Key_Space), [&ran, name, acts] { return ran << name, acts; });
    w.map->bind(
        QKeySequence(Qt::SHIFT | Qt::Key_Right), [&] { return ran << "step", true; }, true);

    w.type(Qt::Key_Space);
    w.type(Qt::Key_Space, Qt::NoModifier, true); // held down: no toggling
    w.type(Qt::Key_Right, Qt::ShiftModifier, true);
    w.type(Qt::Key_Right); // another key altogether
    EXPECT_EQ(ran, (QStringList{"first", "second", "step"}));
    EXPECT_EQ(w.map->keys(), (QList<QKeySequence>{QKeySequence(Qt::Key_Space),
                                                  QKeySequence(Qt::SHIFT | Qt::Key_Right)}));
}

TEST(UiShortcutMap, ATextFieldKeepsItsKeysAndAnItemIsPressedOnlyWhereShownAndEnabled) {
    Window w;
    int saves = 0;
    auto save = ToolbarItem::systemItem(Item::Save, [&] { ++saves; });
    const auto press = [&] { return ShortcutMap::pressToolbarItem(&w.root, save.get()); };
    w.map->bind(QKeySequence(Qt::Key_Space), press);
    EXPECT_FALSE(press()) << "in no bar";
    w.bar->setItems({save});
    auto* field = new QLineEdit(&w.root);
    field->show();
    field->setFocus();
    w.type(Qt::Key_Space);
    EXPECT_EQ(saves, 0) << "a text field takes its spaces";
    field->clearFocus();
    w.type(Qt::Key_Space);
    EXPECT_EQ(saves, 1);
    save->setEnabled(false);
    EXPECT_FALSE(press());
    save->setEnabled(true);
    w.bar->hide();
    EXPECT_FALSE(press());
    EXPECT_EQ(saves, 1);
}
