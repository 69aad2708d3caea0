#include "platform/ui/ShortcutMap.h"

#include "platform/ui/Toolbar.h"

#include <QAbstractButton>
#include <QKeyEvent>

namespace platform {

ShortcutMap::ShortcutMap(QWidget* window) : QObject(window), window_(window) {
    if (window)
        window->installEventFilter(this);
}

ShortcutMap::~ShortcutMap() {
    if (window_)
        window_->removeEventFilter(this);
}

void ShortcutMap::bind(const QKeySequence& key, Action action, bool repeats) {
    if (key.isEmpty() || !action)
        return;
    if (!bindings_.contains(key))
        order_.append(key);
    bindings_[key].append({std::move(action), repeats});
}

bool ShortcutMap::trigger(const QKeySequence& key, bool autoRepeat) {
    const auto found = bindings_.constFind(key);
    if (found == bindings_.constEnd())
        return false;
    // A binding may rebind keys; run over a copy.
    const QList<Binding> bindings = *found;
    for (const Binding& binding : bindings) {
        if (autoRepeat && !binding.repeats)
            continue;
        if (binding.action())
            return true;
    }
    return false;
}

QKeySequence ShortcutMap::keyOf(const QKeyEvent& event) {
    const Qt::KeyboardModifiers modifiers = event.modifiers() & ~Qt::KeypadModifier;
    return QKeySequence(QKeyCombination(modifiers, Qt::Key(event.key())));
}

bool ShortcutMap::pressToolbarItem(QWidget* root, const ToolbarItem* item) {
    if (!root || !item || !item->isEnabled())
        return false;
    for (Toolbar* bar : root->findChildren<Toolbar*>()) {
        if (!bar->isVisibleTo(root))
            continue;
        // The press goes to the button the user would click, so its action
        // runs exactly as a click runs it.
        if (auto* button = qobject_cast<QAbstractButton*>(bar->widgetForItem(item))) {
            button->click();
            return true;
        }
    }
    return false;
}

bool ShortcutMap::eventFilter(QObject* watched, QEvent* event) {
    // Only presses that nothing inside took reach the window itself.
    if (watched == window_ && event->type() == QEvent::KeyPress) {
        auto* key = static_cast<QKeyEvent*>(event);
        if (key->key() != Qt::Key_unknown && trigger(keyOf(*key), key->isAutoRepeat())) {
            key->accept();
            return true;
        }
    }
    return QObject::eventFilter(watched, event);
}

} // namespace platform
