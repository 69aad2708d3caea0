// The extension process: the editor in a window of its own, on the request
// its host (tamsel-edit, or an application through tamsel-host) sends.

#include "AutomationDriver.h"
#include "DemoScript.h"
#include "ExtensionEntry.h"
#include "platform/runtime/DevicePaths.h"
#include "platform/ui/Device.h"
#include "support/FileManager.h"

#include <QApplication>
#include <QFile>
#include <QTimer>
#include <csignal>
#include <cstdio>
#include <optional>

int main(int argc, char** argv) {
    // A file that outgrows the size limit set on this process must fail the
    // write that crosses the limit, as a full disk does, not end the editor.
    std::signal(SIGXFSZ, SIG_IGN);
    // Without a display the editor still runs (for automation), offscreen.
    const bool headless = qEnvironmentVariableIsEmpty("DISPLAY") &&
                          qEnvironmentVariableIsEmpty("WAYLAND_DISPLAY") &&
                          qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM");
    if (headless)
        qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication app(argc, argv);
    QApplication::setApplicationName(QStringLiteral("tamsel-video-editor"));
    // The desktop finds the window's entry (name, icon) by this.
    QGuiApplication::setDesktopFileName(QStringLiteral("org.tamsel.Tamsel"));
    QApplication::setQuitOnLastWindowClosed(false);
    QStringList arguments = app.arguments();
    platform::Device::applyDeviceArgument(arguments);

    // An automation script, or the demo's.
    std::optional<QList<AutomationCommand>> script;
    if (const qsizetype at = arguments.indexOf(QStringLiteral("--automation"));
        at >= 0 && at + 1 < arguments.size()) {
        QFile file(arguments.at(at + 1));
        if (!file.open(QIODevice::ReadOnly)) {
            std::fprintf(stderr, "automation: cannot read %s\n", qPrintable(file.fileName()));
            return 3;
        }
        QString error;
        script = parseAutomationScript(QString::fromUtf8(file.readAll()), &error);
        if (!script) {
            std::fprintf(stderr, "automation: %s\n", qPrintable(error));
            return 3;
        }
    } else if (arguments.contains(QStringLiteral("--demo"))) {
        script = parseAutomationScript(demoScript(), nullptr);
    }

    auto endpoint = platform::ExtensionEndpoint::fromEnvironment();
    if (!endpoint->hasHost()) {
        std::fprintf(stderr, "tamsel-video-editor is started by its host: run tamsel-edit\n");
        return 2;
    }
    platform::DevicePaths::prepareDevice();
    FileManager::defaultManager()->_srSetupTempDirectory();

    int status = 0;
    {
        ExtensionEntry entry(*endpoint);
        QObject::connect(&entry, &ExtensionEntry::ended, &app, &QCoreApplication::quit);
        std::unique_ptr<AutomationDriver> driver;
        if (script) {
            driver = std::make_unique<AutomationDriver>(entry, *script);
            QObject::connect(&entry, &ExtensionEntry::requestBegan, driver.get(),
                             &AutomationDriver::start);
        }
        if (arguments.contains(QStringLiteral("--exit")))
            QObject::connect(&entry, &ExtensionEntry::requestBegan, &app, [&entry] {
                QTimer::singleShot(0, &entry, &ExtensionEntry::endRequest);
            });
        status = app.exec();
        if (driver && driver->failed())
            status = 3;
    }
    // Work already queued (a removal, an album write) finishes first, and so
    // does work queued for the main thread, which may still hold the editor:
    // it must go while the application is there. The host hears meanwhile
    // that the editor is still at it.
    endpoint->finishQueuedWork();
    return status;
}
