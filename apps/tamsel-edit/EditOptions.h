#pragma once

#include <tamsel/VideoEditorHost.h>

#include <QColor>
#include <QString>
#include <QStringList>
#include <optional>

// What the command line asks of the editor.
struct EditOptions {
    QString moviePath; // absolute
    QString appName;
    QString bundleIdentifier;
    QString attachmentPath; // absolute, or empty
    QString shareMessage;   // or null
    QColor tintColor;       // invalid when not given
    QString extensionProgram;
    QStringList extensionArguments; // passed through (--automation, --demo, --device ...)

    // Parses the arguments (without the program name); nullopt with `error`
    // set when they do not make sense. `defaultMovie` is used when no movie is
    // named.
    static std::optional<EditOptions> parse(const QStringList& arguments,
                                            const QString& defaultMovie,
                                            const QString& defaultExtension, QString* error);

    // The request a host makes of the editor.
    tamsel::VideoEditorRequest request() const;

    static QString usage();
};
