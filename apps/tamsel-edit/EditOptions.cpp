#include "EditOptions.h"

#include <QFileInfo>

QString EditOptions::usage() {
    return QStringLiteral(
        "usage: tamsel-edit [MOVIE] [options]\n"
        "Opens the editor on MOVIE (the sample recording when none is given) and\n"
        "prints the activity types the user completed as a JSON array.\n\n"
        "  --app-name NAME        display name of the recorded application\n"
        "  --bundle-id ID         its bundle identifier\n"
        "  --attachment PATH      a file to offer when sharing\n"
        "  --share-message TEXT   replaces the default share text\n"
        "  --tint-color COLOR     tint of the editor's top bar (#rrggbb or a colour name)\n"
        "  --automation SCRIPT    drive the editor with a script (see README)\n"
        "  --demo                 run the typical use on the sample recording\n"
        "  --device phone|tablet  lay the editor out as on that device\n"
        "  --extension PROGRAM    the extension to start (default: tamsel-video-editor)\n");
}

std::optional<EditOptions> EditOptions::parse(const QStringList& arguments,
                                              const QString& defaultMovie,
                                              const QString& defaultExtension, QString* error) {
    EditOptions options;
    options.extensionProgram = defaultExtension;
    QString movie;
    auto fail = [&](const QString& why) {
        if (error)
            *error = why;
        return std::nullopt;
    };
    for (qsizetype i = 0; i < arguments.size(); ++i) {
        const QString& arg = arguments.at(i);
        auto value = [&]() -> std::optional<QString> {
            if (i + 1 >= arguments.size())
                return std::nullopt;
            return arguments.at(++i);
        };
        const bool takesValue =
            arg == QLatin1String("--app-name") || arg == QLatin1String("--bundle-id") ||
            arg == QLatin1String("--attachment") || arg == QLatin1String("--share-message") ||
            arg == QLatin1String("--tint-color") || arg == QLatin1String("--automation") ||
            arg == QLatin1String("--device") || arg == QLatin1String("--extension");
        std::optional<QString> v;
        if (takesValue && !(v = value()))
            return fail(QStringLiteral("%1 needs a value").arg(arg));
        if (arg == QLatin1String("--app-name"))
            options.appName = *v;
        else if (arg == QLatin1String("--bundle-id"))
            options.bundleIdentifier = *v;
        else if (arg == QLatin1String("--attachment"))
            options.attachmentPath = QFileInfo(*v).absoluteFilePath();
        else if (arg == QLatin1String("--share-message"))
            options.shareMessage = *v;
        else if (arg == QLatin1String("--tint-color")) {
            options.tintColor = QColor::fromString(*v);
            if (!options.tintColor.isValid())
                return fail(QStringLiteral("%1 is not a colour").arg(*v));
        } else if (arg == QLatin1String("--extension"))
            options.extensionProgram = *v;
        else if (arg == QLatin1String("--automation"))
            options.extensionArguments << arg << QFileInfo(*v).absoluteFilePath();
        else if (arg == QLatin1String("--device")) {
            if (*v != QLatin1String("phone") && *v != QLatin1String("tablet"))
                return fail(QStringLiteral("--device takes phone or tablet"));
            options.extensionArguments << arg << *v;
        } else if (arg == QLatin1String("--demo") || arg == QLatin1String("--exit"))
            options.extensionArguments << arg;
        else if (arg.startsWith(QLatin1String("--")))
            return fail(QStringLiteral("unknown option %1").arg(arg));
        else if (movie.isEmpty())
            movie = arg;
        else
            return fail(QStringLiteral("only one movie at a time"));
    }
    options.moviePath = QFileInfo(movie.isEmpty() ? defaultMovie : movie).absoluteFilePath();
    if (options.appName.isEmpty())
        options.appName =
            movie.isEmpty() ? QStringLiteral("Tamsel Sample") : QFileInfo(movie).completeBaseName();
    if (options.bundleIdentifier.isEmpty())
        options.bundleIdentifier = QStringLiteral("org.tamsel.Sample");
    return options;
}

tamsel::VideoEditorRequest EditOptions::request() const {
    tamsel::VideoEditorRequest request;
    request.moviePath = moviePath;
    request.appName = appName;
    request.bundleIdentifier = bundleIdentifier;
    request.attachmentPath = attachmentPath;
    request.shareMessage = shareMessage;
    request.tintColor = tintColor;
    request.editorArguments = extensionArguments;
    return request;
}
