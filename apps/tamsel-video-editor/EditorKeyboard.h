#pragma once

#include "editor/TXVideoEditorViewController.h"
#include "platform/ui/ShortcutMap.h"

#include <QObject>
#include <functional>

// The editor's keyboard, as the window that shows it offers it:
//
//   Space            play or pause (the play, pause or overlay play button)
//   I, O             trim start, trim end at the playhead (as a handle drag)
//   Left, Right      the playhead one frame back or on (Shift: one second)
//   Home, End        the playhead to the start or end of the range
//   Ctrl+S           save (the save button, or the trim button when trimming)
//   Escape           cancel the trim (the cancel-trim button)
//
// Every key does what pressing the control does or what the scrubber reports
// for a drag, so the editor cannot tell a key from a hand. A key whose
// control has faded out with the chrome (a shortcut's, or the focused
// control's own) first brings the chrome back, as the hand's tap on the
// video must. Keys do nothing while a sheet or alert is presented over the
// editor.
//
// Main thread only. Lives as long as the window (a Qt child of its map); the
// editor is looked up at each key, as it comes and goes with the request.
class EditorKeyboard : public QObject {
    Q_OBJECT
  public:
    using EditorLookup = std::function<TXVideoEditorViewController*()>;

    EditorKeyboard(QWidget* window, EditorLookup editor);

    // Called when the principal has shown an editor. Names the keys on its
    // controls (tooltips and accessible descriptions of the toolbar items,
    // the overlay play button and the scrubber), and takes the controls of an
    // editor it covers (one built before the inputs came) out of the Tab
    // chain, so that Tab only reaches what the user sees. Calling it again is
    // harmless.
    void editorDidAppear();

    platform::ShortcutMap& map() { return *map_; }

  protected:
    // Sees each key on its way to the focused control.
    bool eventFilter(QObject* watched, QEvent* event) override;

  private:
    // The editor when keys may reach it, else null.
    TXVideoEditorViewController* reachableEditor() const;
    // What a hand does before it can reach a control in the chrome.
    static void revealChrome(TXVideoEditorViewController& editor);
    using ItemMember = std::shared_ptr<platform::ToolbarItem> TXVideoEditorViewController::*;
    bool press(ItemMember item);
    bool pressOverlayPlayButton();
    bool trimAtPlayhead(platform::MovieScrubberHandle handle);
    bool stepPlayhead(int direction, bool large);
    bool playheadToRangeEnd(bool toEnd);
    void describeControls(TXVideoEditorViewController& editor);
    void setAsideCoveredViews(TXVideoEditorViewController& editor);

    QWidget* window_;
    EditorLookup editor_;
    platform::ShortcutMap* map_;
};
