// The extension process: the editor in a window of its own, on the request
// its host sends.

#include "platform/hosting/ExtensionEndpoint.h"
#include "platform/runtime/DevicePaths.h"
#include "platform/runtime/GlobalQueue.h"
#include "support/FileManager.h"

#include <QApplication>
#include <QLabel>
#include <QTimer>

int main(int argc, char** argv)
{
    // Without a display there is nothing to show; run offscreen.
    const bool headless = qEnvironmentVariableIsEmpty("DISPLAY") &&
                          qEnvironmentVariableIsEmpty("WAYLAND_DISPLAY") &&
                          qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM");
    if (headless)
        qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication app(argc, argv);
    QApplication::setApplicationName(QStringLiteral("tamsel-video-editor"));

    platform::DevicePaths::prepareDevice();
    FileManager::defaultManager()->_srSetupTempDirectory();

    auto endpoint = platform::ExtensionEndpoint::fromEnvironment();
    // The extension lives as long as its host wants it.
    endpoint->onDismiss = [&] { app.quit(); };
    endpoint->onHostGone = [&] { app.quit(); };

    QLabel window(QStringLiteral("Tamsel"));
    window.setAlignment(Qt::AlignCenter);
    window.resize(640, 400);
    window.show();
    if (headless || app.arguments().contains(QStringLiteral("--exit")))
        QTimer::singleShot(0, &app, &QCoreApplication::quit);

    const int status = app.exec();
    // Work already queued (a removal, an album write) finishes first.
    platform::GlobalQueue::drain();
    return status;
}
