#pragma once

#include <QString>

// The keys of the host's input items (the titles of the items), and the
// build's identification. Global variables, one per key, so hosts read them
// rather than inlining them.
extern const QString TXVideoEditorExtensionAppNameKey;
// Named "path" while its value says "URL": hosts compile against the one and
// the extension compares against the other.
extern const QString TXVideoEditorExtensionMoviePathKey;
extern const QString TXVideoEditorExtensionBundleIdentifierKey;
extern const QString TXVideoEditorExtensionFileAttachmentKey;
extern const QString TXVideoEditorExtensionOverrideShareMessageKey;
extern const QString TXVideoEditorExtensionOverrideTintColorKey;

extern const double TXVideoEditorExtensionVersionNumber;
extern const char TXVideoEditorExtensionVersionString[];
