#pragma once

#include <QStringList>

// What the extension offers its host over the auxiliary connection: nothing.
class TXVideoEditorExtensionProtocol {
  public:
    virtual ~TXVideoEditorExtensionProtocol() = default;
};

// What the host offers the extension: the one-way finish report.
class TXVideoEditorExtensionHostProtocol {
  public:
    virtual ~TXVideoEditorExtensionHostProtocol() = default;
    // The activity types the user completed, in the order the editor
    // collected them; may be empty. Returns at once; nothing comes back.
    virtual void extensionDidFinishWithActivityTypes(const QStringList& activityTypes) = 0;
};
