// tamsel-publishing-screenshots OUTPUT_DIR: the YouTube upload form in a real
// window, as a user meets it from the share sheet, saved twice: pre-filled the
// way the YouTube activity fills it (form.png), and publishing, with the
// progress overlay over it (publishing.png). Run under Xvfb by the test.
#include "FakePublishingServices.h"
#include "FormTextCell.h"
#include "YouTubePublishingAgent.h"
#include "YouTubeUploadForm.h"
#include "support/TempDir.h"

#include "platform/ui/NavigationController.h"
#include "platform/ui/Window.h"
#include "youtube/TXYouTubeActivityProgressOverlay.h"

#include <QApplication>
#include <QDir>
#include <QTimer>

#include <cstdio>

using namespace testing_support;

namespace {

void settle(int milliseconds) {
    QEventLoop loop;
    QTimer::singleShot(milliseconds, &loop, &QEventLoop::quit);
    loop.exec();
}

bool save(platform::Window& window, const QString& path) {
    if (!window.grab().save(path)) {
        std::fprintf(stderr, "cannot write %s\n", qPrintable(path));
        return false;
    }
    return true;
}

} // namespace

int main(int argc, char** argv) {
    QApplication app(argc, argv);
    if (argc < 2) {
        std::fprintf(stderr, "usage: %s OUTPUT_DIR\n", argv[0]);
        return 2;
    }
    const QDir out(QString::fromLocal8Bit(argv[1]));
    MobileRoot mobile;
    mobile.makeLibrary();
    writeFile(mobile.hostPath(QStringLiteral("Library/Tamsel/TXCapture_YouTube1.mp4")), 48'000'000);

    ScopedFakeServices services;
    services.signIn->signedIn = true;
    services.client->categories = {{"1", "Film & Animation"}, {"10", "Music"},
                                   {"20", "Gaming"},          {"22", "People & Blogs"},
                                   {"23", "Comedy"},          {"27", "Education"}};
    auto agent = std::make_shared<YouTubePublishingAgent>();
    agent->setMediaPath(
        QStringLiteral("/private/var/mobile/Library/Tamsel//TXCapture_YouTube1.mp4"));
    auto navigation = agent->navigationController();
    QObject* form = navigation->viewControllers().first().get();

    // As the activity fills it: by name.
    QObject* table = form->property("_table").value<QObject*>();
    QObject* description = nullptr;
    QMetaObject::invokeMethod(table, "cellForRowAtIndexPath", Q_RETURN_ARG(QObject*, description),
                              Q_ARG(int, 0), Q_ARG(int, 1));
    description->setProperty("value", QStringLiteral("Racer on Tamsel https://flathub.org/apps/"
                                                     "org.example.Racer"));
    description->setProperty("placeholder", QVariant());

    platform::Window window;
    window.resize(540, 620);
    window.setRootViewController(navigation);
    window.show();
    settle(600);
    form->setProperty("_defaultCategory", QStringLiteral("20"));
    agent->form()->titleCell()->setValue(QStringLiteral("Racer: <fastest> lap on the new track"));
    settle(300);
    if (!save(window, out.filePath(QStringLiteral("form.png"))))
        return 1;

    agent->form()->publishItem()->trigger();
    settle(400);
    if (services.client->progress)
        services.client->progress(21'600'000, 48'000'000);
    platform::View* view = navigation->view();
    auto* overlay = new TXYouTubeActivityProgressOverlay(view->bounds());
    view->addSubview(overlay);
    overlay->setShowing_animated(true, true);
    settle(700);
    if (!save(window, out.filePath(QStringLiteral("publishing.png"))))
        return 1;
    window.close();
    return 0;
}
