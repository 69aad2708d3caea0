#pragma once

#include "editor/TXVideoEditorViewController.h"

#include <QJsonObject>
#include <QString>
#include <memory>

// The editor's toolbar items by their property names, and a snapshot of its
// state as automation scripts see it.
namespace EditorSnapshot {

// The item the editor holds under `name` ("playButton", ...), or null.
std::shared_ptr<platform::ToolbarItem> itemNamed(TXVideoEditorViewController& editor,
                                                 const QString& name);
// The property name of `item` ("" for an item the editor does not hold).
QString nameOfItem(TXVideoEditorViewController& editor, const platform::ToolbarItem* item);
// The control that has the keyboard focus in the editor's window: an item's
// name, "avTrimmer", "videoOverlayPlayButton", another widget's class name,
// or "" when nothing has it.
QString focusedControl(TXVideoEditorViewController& editor);
// Where the shown controls are in the window, in device-independent pixels:
// name ("topToolBar", "bottomToolBar", "avTrimmer", "videoOverlayPlayButton",
// or an item's name) to [x, y, width, height].
QJsonObject frames(TXVideoEditorViewController& editor);
// introMode, trimming, exporting, scrubbing, hasEdit, padMode, uiHidden,
// editStartTime, editEndTime, currentTime, videoURL, topToolBar,
// bottomToolBar (empty when it is not in the view), activityTypes,
// shareSheet (null, or the open sheet's offered activity types in order and
// its items as text), focus, frames.
QJsonObject dump(TXVideoEditorViewController& editor);

} // namespace EditorSnapshot
