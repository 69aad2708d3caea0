// The host side: starts the editor extension in a process of its own, waits
// for it and prints the activity types the user completed as a JSON array.

#include <QCoreApplication>
#include <QDir>
#include <QJsonArray>
#include <QJsonDocument>
#include <QProcess>
#include <cstdio>

int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    const QString extension =
        QDir(QCoreApplication::applicationDirPath()).filePath(QStringLiteral("tamsel-video-editor"));

    QProcess process;
    process.setProcessChannelMode(QProcess::ForwardedChannels);
    process.start(extension, app.arguments().mid(1));
    if (!process.waitForStarted()) {
        std::fprintf(stderr, "tamsel-edit: could not start the editor (%s)\n",
                     qPrintable(process.errorString()));
        return 1;
    }
    process.waitForFinished(-1);
    if (process.exitStatus() != QProcess::NormalExit || process.exitCode() != 0) {
        std::fprintf(stderr, "tamsel-edit: the editor ended abnormally (exit %d)\n", process.exitCode());
        return 1;
    }
    const QJsonArray activityTypes;
    std::printf("%s\n", QJsonDocument(activityTypes).toJson(QJsonDocument::Compact).constData());
    return 0;
}
