// The host side: starts the editor extension in a process of its own, hands it
// the input items, and prints the activity types the user completed as one
// JSON array on stdout.

#include "EditOptions.h"
#include "platform/hosting/host/ExtensionLauncher.h"

#include <QCoreApplication>
#include <QDir>
#include <QJsonArray>
#include <QJsonDocument>
#include <cstdio>

namespace {

QString besideMe(const QString& relative) {
    return QDir::cleanPath(QCoreApplication::applicationDirPath() + QLatin1Char('/') + relative);
}

void print(const QStringList& activityTypes) {
    const QJsonArray array = QJsonArray::fromStringList(activityTypes);
    std::printf("%s\n", QJsonDocument(array).toJson(QJsonDocument::Compact).constData());
    std::fflush(stdout);
}

} // namespace

int main(int argc, char** argv) {
    QCoreApplication app(argc, argv);
    const QStringList arguments = app.arguments().mid(1);
    if (arguments.contains(QLatin1String("--help")) || arguments.contains(QLatin1String("-h"))) {
        std::printf("%s", qPrintable(EditOptions::usage()));
        return 0;
    }
    QString error;
    const auto options = EditOptions::parse(
        arguments, besideMe(QStringLiteral("../share/tamsel/sample/recording.mp4")),
        besideMe(QStringLiteral("tamsel-video-editor")), &error);
    if (!options) {
        std::fprintf(stderr, "tamsel-edit: %s\n\n%s", qPrintable(error),
                     qPrintable(EditOptions::usage()));
        return 2;
    }

    platform::ExtensionLauncher launcher;
    std::optional<QStringList> reported;
    QObject::connect(&launcher, &platform::ExtensionLauncher::extensionDidFinishWithActivityTypes,
                     [&](const QStringList& activityTypes) {
                         // The user is done: the host takes the list and closes the editor.
                         if (reported)
                             return;
                         reported = activityTypes;
                         print(activityTypes);
                         launcher.dismiss();
                     });
    int status = 0;
    QObject::connect(
        &launcher, &platform::ExtensionLauncher::extensionEnded, [&](int exitCode, bool crashed) {
            if (crashed) {
                std::fprintf(stderr, "tamsel-edit: the editor ended abnormally (%s %d)\n",
                             launcher.process().exitStatus() == QProcess::CrashExit ? "crash,"
                                                                                    : "exit status",
                             exitCode);
                status = 1;
            } else if (!reported) {
                // The window was closed: the editor was dismissed with nothing done.
                print({});
            }
            app.quit();
        });

    if (!launcher.start(options->extensionProgram, options->extensionArguments,
                        options->inputItems(), &error)) {
        std::fprintf(stderr, "tamsel-edit: cannot start the editor: %s\n", qPrintable(error));
        return 1;
    }
    app.exec();
    return status;
}
