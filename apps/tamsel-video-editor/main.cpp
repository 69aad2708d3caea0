// The extension process: the editor in a window of its own.

#include "platform/runtime/DevicePaths.h"
#include "platform/runtime/GlobalQueue.h"
#include "support/FileManager.h"

#include <QApplication>
#include <QLabel>
#include <QTimer>

int main(int argc, char** argv)
{
    // Without a display there is nothing to show; run offscreen and leave.
    const bool headless = qEnvironmentVariableIsEmpty("DISPLAY") &&
                          qEnvironmentVariableIsEmpty("WAYLAND_DISPLAY") &&
                          qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM");
    if (headless)
        qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication app(argc, argv);
    QApplication::setApplicationName(QStringLiteral("tamsel-video-editor"));

    platform::DevicePaths::prepareDevice();
    FileManager::defaultManager()->_srSetupTempDirectory();

    QLabel window(QStringLiteral("Tamsel"));
    window.setAlignment(Qt::AlignCenter);
    window.resize(640, 400);
    window.show();
    if (headless || app.arguments().contains(QStringLiteral("--exit")))
        QTimer::singleShot(0, &app, &QCoreApplication::quit);

    const int status = app.exec();
    platform::GlobalQueue::drain();
    return status;
}
