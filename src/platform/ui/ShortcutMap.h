#pragma once

#include <QHash>
#include <QKeySequence>
#include <QList>
#include <QObject>
#include <QPointer>
#include <QWidget>
#include <functional>

namespace platform {

class ToolbarItem;

// The keyboard shortcuts of one window. A key press that the focused control
// does not take (a toolbar button takes Space and Return, the movie scrubber
// its arrows, ...) travels up to the window, where the map looks the key up
// and runs its bindings in the order they were added until one acts. So a
// focused control always has the first word, and a shortcut only ever does
// what pressing a control or moving a part of one does.
//
// Main thread only. The map belongs to the window (a Qt child) and watches it
// from construction; bindings hold no widgets, they find their target when
// the key comes.
class ShortcutMap : public QObject {
    Q_OBJECT
  public:
    // Runs when its key comes; returns whether it acted (false passes the key
    // on to the next binding).
    using Action = std::function<bool()>;

    explicit ShortcutMap(QWidget* window);
    ~ShortcutMap() override;

    // Adds a binding. Auto-repeated presses reach it only when `repeats` is
    // true (stepping, not toggling).
    void bind(const QKeySequence& key, Action action, bool repeats = false);
    QList<QKeySequence> keys() const { return order_; }

    // Runs the bindings of `key` as a press of it does; whether one acted.
    bool trigger(const QKeySequence& key, bool autoRepeat = false);

    // The key of a key event as bindings name it (keypad keys count as the
    // plain ones).
    static QKeySequence keyOf(const QKeyEvent& event);

    // Presses `item` where a toolbar inside `root` shows it, as a click on
    // its button does. False when no toolbar there shows it or it is
    // disabled.
    static bool pressToolbarItem(QWidget* root, const ToolbarItem* item);

  protected:
    bool eventFilter(QObject* watched, QEvent* event) override;

  private:
    struct Binding {
        Action action;
        bool repeats;
    };
    QPointer<QWidget> window_;
    QHash<QKeySequence, QList<Binding>> bindings_;
    QList<QKeySequence> order_;
};

} // namespace platform
