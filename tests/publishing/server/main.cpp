// tamsel-fake-youtube: the local fake of the sign-in and upload API as a
// process of its own, for the benchmark and for trying the editor by hand.
// Prints the environment that points the plug-in at it, one NAME=VALUE a
// line, then an empty line, and serves until its standard input closes.
#include "FakeYouTubeServer.h"

#include <QCommandLineParser>
#include <QCoreApplication>
#include <QSocketNotifier>
#include <QTemporaryDir>

#include <cstdio>
#include <unistd.h>

int main(int argc, char** argv) {
    QCoreApplication app(argc, argv);
    QCommandLineParser parser;
    parser.setApplicationDescription(QStringLiteral("Local fake of the YouTube upload API"));
    parser.addHelpOption();
    const QCommandLineOption storage(
        QStringLiteral("storage"), QStringLiteral("Directory for the uploads (default: temporary)"),
        QStringLiteral("dir"));
    const QCommandLineOption token(QStringLiteral("access-token"),
                                   QStringLiteral("An access token to accept"),
                                   QStringLiteral("token"));
    const QCommandLineOption refresh(QStringLiteral("refresh-token"),
                                     QStringLiteral("A refresh token to accept"),
                                     QStringLiteral("token"));
    const QCommandLineOption discard(QStringLiteral("discard"),
                                     QStringLiteral("Count uploaded bytes without storing them"));
    const QCommandLineOption delay(QStringLiteral("delay"),
                                   QStringLiteral("Milliseconds every answer waits"),
                                   QStringLiteral("ms"));
    parser.addOptions({storage, token, refresh, discard, delay});
    parser.process(app);

    QTemporaryDir temporary;
    const QString dir = parser.isSet(storage) ? parser.value(storage) : temporary.path();
    testing_support::FakeYouTubeServer server(dir);
    if (!server.start()) {
        std::fprintf(stderr, "tamsel-fake-youtube: cannot listen on 127.0.0.1\n");
        return 1;
    }
    if (parser.isSet(token))
        server.addAccessToken(parser.value(token), 24 * 3600);
    if (parser.isSet(refresh))
        server.addRefreshToken(parser.value(refresh));
    server.setStoresUploads(!parser.isSet(discard));
    if (parser.isSet(delay)) {
        auto faults = server.faults();
        faults.responseDelayMs = parser.value(delay).toInt();
        server.setFaults(faults);
    }
    for (const QString& line : server.environment())
        std::printf("%s\n", qPrintable(line));
    std::printf("\n");
    std::fflush(stdout);

    QSocketNotifier input(STDIN_FILENO, QSocketNotifier::Read);
    QObject::connect(&input, &QSocketNotifier::activated, &app, [&] {
        char buffer[256];
        if (::read(STDIN_FILENO, buffer, sizeof buffer) <= 0)
            app.quit();
    });
    return app.exec();
}
