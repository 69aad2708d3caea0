#include "ActivityFixture.h"

#include "media/MediaFixtures.h"
#include "platform/runtime/DevicePaths.h"
#include "platform/runtime/MethodTable.h"

ActivityFixture::ActivityFixture() {
    language.unset("LC_ALL");
    language.unset("LC_MESSAGES");
    language.unset("LANGUAGE");
    language.set("LANG", "en_US.UTF-8");
    device.makeLibrary();
    testmedia::MovieSpec shape;
    shape.seconds = 1;
    moviePath = mediatest::movieFor(shape);
    FakePublishingAgent::nextFormHasMembers = true;
    activity = TXYouTubeActivity::init();
    activity->setFinishHandler([this](bool completed) {
        finished = completed;
        ++finishes;
    });
}

ActivityFixture::~ActivityFixture() {
    // Each controller request exchanges the form's preselection code with the
    // activity's; the next test starts from the form's own.
    FakeUploadForm probe;
    probe.categoriesDidArrive({});
    if (probe.ownSelections == 0)
        platform::MethodTable::exchangeImplementations(&FakeUploadForm::staticMetaObject,
                                                       &TXYouTubeActivity::staticMetaObject,
                                                       "_selectComedyPickerRow");
}

QVariantList ActivityFixture::items() const {
    return {QStringLiteral("Check out my recording of Racer by Example Games!"),
            QUrl(QStringLiteral("https://flathub.org/apps/org.example.Racer")),
            QUrl::fromLocalFile(moviePath)};
}

std::shared_ptr<platform::ViewController> ActivityFixture::pick() {
    activity->prepareWithActivityItems(items());
    return activity->activityViewController();
}

QString ActivityFixture::movieHostPath() const {
    return platform::DevicePaths::hostPathOfUrl(activity->movieURL);
}
