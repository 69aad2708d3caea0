#include "EditorKeyboard.h"

#include "platform/ui/Button.h"

#include <QApplication>

#include <cmath>

using namespace platform;

namespace {

// Key sequences are made when asked for: the platform's standard keys are
// only known once the application is there.
QKeySequence playPauseKey() {
    return QKeySequence(Qt::Key_Space);
}
QKeySequence saveKey() {
    return QKeySequence(QKeySequence::Save);
}
QKeySequence cancelTrimKey() {
    return QKeySequence(Qt::Key_Escape);
}
QKeySequence trimStartKey() {
    return QKeySequence(Qt::Key_I);
}
QKeySequence trimEndKey() {
    return QKeySequence(Qt::Key_O);
}

// Whether a toolbar of the editor shows `item` now.
bool shown(TXVideoEditorViewController& editor, const ToolbarItem* item) {
    for (Toolbar* bar : {editor.topToolBar.get(), editor.bottomToolBar.get()})
        if (bar && bar->superview() && bar->widgetForItem(item))
            return true;
    return false;
}

} // namespace

EditorKeyboard::EditorKeyboard(QWidget* window, EditorLookup editor)
    : window_(window), editor_(std::move(editor)), map_(new ShortcutMap(window)) {
    setParent(map_);
    // Space: pause while playing, else play; before the first play in the
    // compact layout only the overlay offers play.
    map_->bind(playPauseKey(), [this] { return press(&TXVideoEditorViewController::pauseButton); });
    map_->bind(playPauseKey(), [this] { return press(&TXVideoEditorViewController::playButton); });
    map_->bind(playPauseKey(), [this] { return pressOverlayPlayButton(); });
    map_->bind(saveKey(), [this] { return press(&TXVideoEditorViewController::saveButton); });
    map_->bind(saveKey(), [this] { return press(&TXVideoEditorViewController::trimButton); });
    map_->bind(cancelTrimKey(),
               [this] { return press(&TXVideoEditorViewController::cancelTrimButton); });
    map_->bind(trimStartKey(), [this] { return trimAtPlayhead(MovieScrubberHandle::Start); });
    map_->bind(trimEndKey(), [this] { return trimAtPlayhead(MovieScrubberHandle::End); });
    const bool repeats = true;
    map_->bind(
        QKeySequence(Qt::Key_Left), [this] { return stepPlayhead(-1, false); }, repeats);
    map_->bind(
        QKeySequence(Qt::Key_Right), [this] { return stepPlayhead(1, false); }, repeats);
    map_->bind(
        QKeySequence(Qt::SHIFT | Qt::Key_Left), [this] { return stepPlayhead(-1, true); }, repeats);
    map_->bind(
        QKeySequence(Qt::SHIFT | Qt::Key_Right), [this] { return stepPlayhead(1, true); }, repeats);
    map_->bind(QKeySequence(Qt::Key_Home), [this] { return playheadToRangeEnd(false); });
    map_->bind(QKeySequence(Qt::Key_End), [this] { return playheadToRangeEnd(true); });
    // The focused control has the first word on a key, before the map; the
    // chrome it sits in must be seen first.
    qApp->installEventFilter(this);
}

bool EditorKeyboard::eventFilter(QObject* watched, QEvent* event) {
    if (event->type() != QEvent::KeyPress || watched != window_->focusWidget())
        return false;
    TXVideoEditorViewController* editor = reachableEditor();
    if (!editor || !editor->isUIHidden())
        return false;
    for (QWidget* chrome : {static_cast<QWidget*>(editor->topToolBar.get()),
                            static_cast<QWidget*>(editor->bottomToolBar.get()),
                            static_cast<QWidget*>(editor->scrubberContainterView.get())})
        if (chrome && chrome->isAncestorOf(static_cast<QWidget*>(watched)))
            revealChrome(*editor);
    return false;
}

TXVideoEditorViewController* EditorKeyboard::reachableEditor() const {
    TXVideoEditorViewController* editor = editor_ ? editor_() : nullptr;
    if (!editor || !editor->isViewLoaded() || !editor->view()->isVisibleTo(window_))
        return nullptr;
    // A sheet or an alert over the editor has the keys to itself.
    for (ViewController* c = editor; c; c = c->parentViewController())
        if (c->presentedViewController())
            return nullptr;
    return editor;
}

void EditorKeyboard::revealChrome(TXVideoEditorViewController& editor) {
    if (editor.isUIHidden())
        editor.handleSingleTap(nullptr);
}

bool EditorKeyboard::press(ItemMember item) {
    TXVideoEditorViewController* editor = reachableEditor();
    if (!editor)
        return false;
    const std::shared_ptr<ToolbarItem> target = editor->*item;
    if (!target || !target->isEnabled() || !shown(*editor, target.get()))
        return false;
    revealChrome(*editor);
    return ShortcutMap::pressToolbarItem(editor->view(), target.get());
}

bool EditorKeyboard::pressOverlayPlayButton() {
    TXVideoEditorViewController* editor = reachableEditor();
    if (!editor)
        return false;
    QWidget* overlay = editor->videoOverlayPlayButtonView.get();
    if (!overlay || !overlay->parentWidget() || !overlay->isVisibleTo(editor->view()))
        return false;
    auto* button = qobject_cast<Button*>(overlay);
    if (!button)
        button = overlay->findChild<Button*>();
    if (!button || !button->isEnabled())
        return false;
    button->press();
    return true;
}

bool EditorKeyboard::trimAtPlayhead(MovieScrubberHandle handle) {
    TXVideoEditorViewController* editor = reachableEditor();
    MovieScrubber* scrubber = editor ? editor->avTrimmer.get() : nullptr;
    if (!scrubber || !scrubber->isEditable() || !(scrubber->duration() > 0) ||
        !std::isfinite(scrubber->value()))
        return false;
    revealChrome(*editor);
    return scrubber->trimHandleTo(handle, scrubber->value());
}

bool EditorKeyboard::stepPlayhead(int direction, bool large) {
    TXVideoEditorViewController* editor = reachableEditor();
    MovieScrubber* scrubber = editor ? editor->avTrimmer.get() : nullptr;
    if (!scrubber || !(scrubber->duration() > 0))
        return false;
    revealChrome(*editor);
    scrubber->stepPart(MovieScrubberHandle::Playhead, direction, large);
    return true;
}

bool EditorKeyboard::playheadToRangeEnd(bool toEnd) {
    TXVideoEditorViewController* editor = reachableEditor();
    MovieScrubber* scrubber = editor ? editor->avTrimmer.get() : nullptr;
    if (!scrubber || !(scrubber->duration() > 0))
        return false;
    revealChrome(*editor);
    // The scrubber keeps the playhead inside the range while trimming.
    scrubber->movePartTo(MovieScrubberHandle::Playhead, toEnd ? scrubber->duration() : 0.0);
    return true;
}

void EditorKeyboard::editorDidAppear() {
    TXVideoEditorViewController* editor = editor_ ? editor_() : nullptr;
    if (!editor || !editor->isViewLoaded())
        return;
    describeControls(*editor);
    setAsideCoveredViews(*editor);
}

void EditorKeyboard::setAsideCoveredViews(TXVideoEditorViewController& editor) {
    QWidget* shown = editor.view();
    QWidget* parent = shown->parentWidget();
    if (!parent)
        return;
    // Siblings come in stacking order: those before the editor's view lie
    // under it. A disabled view keeps its looks but no control inside it,
    // made now or later, can take the focus.
    for (QObject* child : parent->children()) {
        if (child == shown)
            break;
        auto* view = qobject_cast<QWidget*>(child);
        if (!view || view->isWindow() || !shown->geometry().contains(view->geometry()))
            continue;
        if (QWidget* focus = window_->focusWidget(); focus && view->isAncestorOf(focus))
            focus->clearFocus();
        view->setEnabled(false);
    }
}

void EditorKeyboard::describeControls(TXVideoEditorViewController& e) {
    TXVideoEditorViewController* editor = &e;
    for (const auto& item : {editor->playButton, editor->pauseButton})
        if (item)
            item->setShortcut(playPauseKey());
    for (const auto& item : {editor->saveButton, editor->trimButton})
        if (item)
            item->setShortcut(saveKey());
    if (editor->cancelTrimButton)
        editor->cancelTrimButton->setShortcut(cancelTrimKey());

    const auto native = [](const QKeySequence& key) {
        return key.toString(QKeySequence::NativeText);
    };
    if (QWidget* overlay = editor->videoOverlayPlayButtonView.get()) {
        QWidget* button = overlay->findChild<Button*>();
        for (QWidget* w : {overlay, button}) {
            if (!w)
                continue;
            w->setToolTip(tr("Play (%1)").arg(native(playPauseKey())));
            w->setAccessibleDescription(tr("Shortcut: %1").arg(native(playPauseKey())));
        }
    }
    if (MovieScrubber* scrubber = editor->avTrimmer.get()) {
        const QString keys =
            tr("%1 and %2 step one frame, with %3 one second; %4 and %5 set the trim start "
               "and end at the playhead; %6 cancels the trim.")
                .arg(native(QKeySequence(Qt::Key_Left)), native(QKeySequence(Qt::Key_Right)),
                     tr("Shift"), native(trimStartKey()), native(trimEndKey()),
                     native(cancelTrimKey()));
        scrubber->setAccessibleDescription(keys);
        scrubber->setToolTip(keys);
    }
}
