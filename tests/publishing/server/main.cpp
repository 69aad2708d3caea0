// tamsel-fake-youtube [--discard] [--access-token T] [--refresh-token T]: the
// local fake of the sign-in and upload API as a process of its own, for the
// benchmark and for trying the editor by hand. Prints the environment that
// points the plug-in at it, one NAME=VALUE a line, then an empty line, and
// serves until its standard input closes. --discard counts what arrives
// instead of storing it.
#include "FakeYouTubeServer.h"

#include <QCoreApplication>
#include <QSocketNotifier>
#include <QTemporaryDir>

#include <cstdio>
#include <unistd.h>

int main(int argc, char** argv) {
    QCoreApplication app(argc, argv);
    const QStringList args = app.arguments();
    const auto option = [&](const char* name) {
        const qsizetype at = args.indexOf(QLatin1String(name));
        return at > 0 ? args.value(at + 1) : QString();
    };
    QTemporaryDir storage;
    testing_support::FakeYouTubeServer server(
        args.contains(QLatin1String("--discard")) ? QString() : storage.path());
    if (!server.start()) {
        std::fprintf(stderr, "tamsel-fake-youtube: cannot listen on 127.0.0.1\n");
        return 1;
    }
    if (const QString token = option("--access-token"); !token.isEmpty())
        server.addAccessToken(token);
    if (const QString token = option("--refresh-token"); !token.isEmpty())
        server.addRefreshToken(token);
    std::printf("%s\n\n", qPrintable(server.environment().join(QLatin1Char('\n'))));
    std::fflush(stdout);

    QSocketNotifier input(STDIN_FILENO, QSocketNotifier::Read);
    QObject::connect(&input, &QSocketNotifier::activated, &app, [&] {
        char buffer[256];
        if (::read(STDIN_FILENO, buffer, sizeof buffer) <= 0)
            app.quit();
    });
    return app.exec();
}
