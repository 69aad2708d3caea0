// tamsel-ui-gallery: every control of the toolkit layer in one real window.
//
//   tamsel-ui-gallery [--device phone|tablet] [--present alert|popover] [--screenshot FILE]
//
// --present shows the alert or the popover over the gallery once it is up.
// With --screenshot the window is saved to FILE (PNG) once the late parts
// (thumbnails, the spinner) have arrived, or after ten seconds, and the
// program exits; status 1 when the file cannot be written.

#include "GalleryViewController.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/ui/Device.h"
#include "platform/ui/Window.h"

#include <QApplication>
#include <QElapsedTimer>
#include <QTimer>
#include <cstdio>

int main(int argc, char** argv) {
    QApplication app(argc, argv);
    QApplication::setApplicationName(QStringLiteral("tamsel-ui-gallery"));
    QStringList arguments = QApplication::arguments();
    platform::Device::applyDeviceArgument(arguments);
    QString screenshot;
    if (const int at = int(arguments.indexOf(QStringLiteral("--screenshot"))); at >= 0) {
        if (at + 1 >= arguments.size()) {
            std::fprintf(stderr, "--screenshot needs a file name\n");
            return 2;
        }
        screenshot = arguments.at(at + 1);
    }

    QString present;
    if (const int at = int(arguments.indexOf(QStringLiteral("--present")));
        at >= 0 && at + 1 < arguments.size())
        present = arguments.at(at + 1);

    platform::Window window;
    window.setWindowTitle(QStringLiteral("Tamsel UI gallery"));
    auto gallery = std::make_shared<GalleryViewController>();
    window.resize(1000, 720);
    window.setRootViewController(gallery);
    window.show();
    if (present == QLatin1String("alert"))
        QTimer::singleShot(0, gallery.get(), [&] { gallery->presentAlert(); });
    else if (present == QLatin1String("popover"))
        QTimer::singleShot(0, gallery.get(), [&] { gallery->presentPopover(); });
    else if (!present.isEmpty())
        std::fprintf(stderr, "--present takes alert or popover\n");

    int status = 0;
    // Outlives the loop: the poll below reads it on every turn.
    QElapsedTimer waited;
    if (!screenshot.isEmpty()) {
        auto* poll = new QTimer(&app);
        waited.start();
        QObject::connect(poll, &QTimer::timeout, &app, [&, poll] {
            // A moment more after settling lets the last fade finish.
            if (!(gallery->isSettled() && waited.elapsed() > 800) && waited.elapsed() < 10000)
                return;
            poll->stop();
            if (!window.grab().save(screenshot, "PNG")) {
                std::fprintf(stderr, "cannot write %s\n", qPrintable(screenshot));
                status = 1;
            }
            app.quit();
        });
        poll->start(100);
    }
    const int result = app.exec();
    platform::GlobalQueue::drain();
    return status ? status : result;
}
