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
// introMode, trimming, exporting, scrubbing, hasEdit, padMode, uiHidden,
// editStartTime, editEndTime, currentTime, videoURL, topToolBar,
// bottomToolBar (empty when it is not in the view), activityTypes,
// shareSheet (null, or the open sheet's offered activity types in order and
// its items as text).
QJsonObject dump(TXVideoEditorViewController& editor);

} // namespace EditorSnapshot
