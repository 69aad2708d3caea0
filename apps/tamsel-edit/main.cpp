// The host side: starts the editor extension in a process of its own, hands it
// the input items, and prints the activity types the user completed as one
// JSON array on stdout. Built on the tamsel-host library, as a recorder is.

#include "EditOptions.h"

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

    tamsel::VideoEditorHost editor;
    editor.setEditorProgram(options->extensionProgram);
    int status = 0;
    QObject::connect(&editor, &tamsel::VideoEditorHost::finished, print);
    QObject::connect(&editor, &tamsel::VideoEditorHost::ended,
                     [&](bool abnormal, const QString& how) {
                         if (abnormal) {
                             std::fprintf(stderr, "tamsel-edit: the editor ended abnormally (%s)\n",
                                          qPrintable(how));
                             status = 1;
                         }
                         app.quit();
                     });
    if (!editor.open(options->request(), &error)) {
        std::fprintf(stderr, "tamsel-edit: cannot start the editor: %s\n", qPrintable(error));
        return 1;
    }
    app.exec();
    return status;
}
