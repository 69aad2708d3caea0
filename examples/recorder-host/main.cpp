// What a screen recorder does once it has a recording: it opens the Tamsel
// editor on it and learns what the user did there.
//
//   recorder-host RECORDING [editor arguments...]

#include <tamsel/VideoEditorHost.h>

#include <QCoreApplication>
#include <cstdio>

int main(int argc, char** argv) {
    QCoreApplication app(argc, argv);
    const QStringList arguments = app.arguments();
    if (arguments.size() < 2) {
        std::fprintf(stderr, "usage: recorder-host RECORDING [editor arguments...]\n");
        return 2;
    }

    tamsel::VideoEditorRequest request;
    request.moviePath = arguments.at(1);
    request.appName = QStringLiteral("Example Recorder");
    request.bundleIdentifier = QStringLiteral("org.example.Recorder");
    request.editorArguments = arguments.mid(2);

    tamsel::VideoEditorHost editor;
    QObject::connect(&editor, &tamsel::VideoEditorHost::finished,
                     [](const QStringList& activityTypes) {
                         if (activityTypes.isEmpty())
                             std::printf("The user did nothing with the recording.\n");
                         for (const QString& type : activityTypes)
                             std::printf("The user completed: %s\n", qPrintable(type));
                     });
    QObject::connect(&editor, &tamsel::VideoEditorHost::ended,
                     [&app](bool abnormal, const QString& how) {
                         if (abnormal)
                             std::fprintf(stderr, "The editor failed (%s).\n", qPrintable(how));
                         app.exit(abnormal ? 1 : 0);
                     });

    QString error;
    if (!editor.open(request, &error)) {
        std::fprintf(stderr, "Cannot open the editor: %s\n", qPrintable(error));
        return 1;
    }
    return app.exec();
}
