#include "TXVideoEditorExtensionKeys.h"

const QString TXVideoEditorExtensionAppNameKey = QStringLiteral("TXVideoEditorExtensionAppNameKey");
const QString TXVideoEditorExtensionMoviePathKey =
    QStringLiteral("TXVideoEditorExtensionMovieURLKey");
const QString TXVideoEditorExtensionBundleIdentifierKey =
    QStringLiteral("TXVideoEditorExtensionBundleIdentifierKey");
const QString TXVideoEditorExtensionFileAttachmentKey =
    QStringLiteral("TXVideoEditorExtensionFileAttachmentKey");
const QString TXVideoEditorExtensionOverrideShareMessageKey =
    QStringLiteral("TXVideoEditorExtensionOverrideShareMessageKey");
const QString TXVideoEditorExtensionOverrideTintColorKey =
    QStringLiteral("TXVideoEditorExtensionOverrideTintColorKey");

const double TXVideoEditorExtensionVersionNumber = 1.0;
const char TXVideoEditorExtensionVersionString[] =
    "@(#)PROGRAM:TamselVideoEditor  PROJECT:Tamsel-1.0";
