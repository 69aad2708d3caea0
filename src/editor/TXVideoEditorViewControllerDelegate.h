#pragma once

#include <QStringList>

class TXVideoEditorViewController;

// Who hears that the user is done with the editor.
class TXVideoEditorViewControllerDelegate {
  public:
    virtual ~TXVideoEditorViewControllerDelegate() = default;
    // Sent on the main thread when done or cancel is pressed, after playback
    // has paused, with the editor's list of completed activity types.
    virtual void videoEditor_didFinishWithActivityTypes(TXVideoEditorViewController* editor,
                                                        const QStringList& activityTypes) = 0;
};
