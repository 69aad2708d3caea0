// The YouTube activity against fakes of the export session, the plug-in
// loader, the agent and the browser: its identity, the upload file and the
// form it hands the sheet, and the alert whose buttons finish it.

#include "ShareFakes.h"
#include "YouTubeFakes.h"
#include "media/MediaFixtures.h"
#include "platform/media/Asset.h"
#include "platform/runtime/DevicePaths.h"
#include "platform/runtime/Error.h"
#include "platform/runtime/MethodTable.h"
#include "platform/services/PublishingPlugin.h"
#include "platform/ui/Alert.h"
#include "platform/ui/NavigationController.h"
#include "platform/ui/Window.h"
#include "support/LogCapture.h"
#include "support/TempDir.h"
#include "support/Wait.h"
#include "youtube/TXYouTubeActivity.h"

#include <QDateTime>
#include <QFile>
#include <QLineEdit>
#include <QPushButton>
#include <QRegularExpression>
#include <QTest>
#include <gtest/gtest.h>

using namespace platform;
using namespace testing_support;

namespace {

const QString kWatchURL = QStringLiteral("https://www.youtube.com/watch?v=dQw4w9WgXcQ");

// A YouTube activity as the sheet holds it, in a temporary device, over a
// real movie made for the test run.
class ActivityFixture : public ::testing::Test {
  protected:
    ActivityFixture() {
        for (const char* name : {"LC_ALL", "LC_MESSAGES", "LANGUAGE"})
            language.unset(name);
        language.set("LANG", "en_US.UTF-8");
        device.makeLibrary();
        loader->agentClass = &FakePublishingAgent::staticMetaObject;
        FakePublishingAgent::nextFormHasMembers = true;
        activity->setFinishHandler([this](bool completed) {
            finished = completed;
            ++finishes;
        });
    }
    ~ActivityFixture() override {
        // Each controller request exchanges the form's preselection code with
        // the activity's; the next test starts from the form's own.
        FakeUploadForm probe;
        probe.categoriesDidArrive({});
        if (probe.ownSelections == 0)
            MethodTable::exchangeImplementations(&FakeUploadForm::staticMetaObject,
                                                 &TXYouTubeActivity::staticMetaObject,
                                                 "_selectComedyPickerRow");
    }

    QVariantList items() const {
        return {QStringLiteral("Check out my recording of Racer by Example Games!"),
                QUrl(QStringLiteral("https://flathub.org/apps/org.example.Racer")),
                QUrl::fromLocalFile(moviePath)};
    }
    // Prepares the activity and asks for its controller, as the sheet does
    // once the user picked it.
    std::shared_ptr<ViewController> pick() {
        activity->prepareWithActivityItems(items());
        return activity->activityViewController();
    }
    FakeUploadForm* form() const { return FakePublishingAgent::last()->form(); }

    MobileRoot device;
    ScopedEnv language;
    ControlledExportSessions exports;
    InPlace<PublishingPluginLoader, FakePluginLoader> loader;
    FakeBrowser browser;
    LogCapture log;
    // A desktop and a microphone track, as recorders write them.
    QString moviePath = mediatest::movieFor([] {
        testmedia::MovieSpec shape;
        shape.seconds = 1;
        shape.audioTracks = 2;
        return shape;
    }());
    std::shared_ptr<TXYouTubeActivity> activity = TXYouTubeActivity::init();
    std::optional<bool> finished; // the completed flag the activity finished with
    int finishes = 0;
};

} // namespace

TEST_F(ActivityFixture, IdentityAndUploadFileAreFixedAndTheDeviceDecidesWhetherItCanPerform) {
    EXPECT_EQ(activity->activityType(), "TXPublishToYouTube");
    EXPECT_EQ(activity->activityTitle(), "YouTube");
    EXPECT_EQ(activity->activityCategory(), ActivityCategory::Share);
    EXPECT_TRUE(activity->canPerformWithActivityItems({}));
    {
        ScopedEnv off("TAMSEL_DISABLED_CAPABILITIES", "video-publishing");
        EXPECT_FALSE(activity->canPerformWithActivityItems(items()));
    }
    EXPECT_EQ(activity->activityImage().deviceIndependentSize(), QSizeF(48, 48));
    EXPECT_EQ(activity->_activitySettingsImage().deviceIndependentSize(), QSizeF(29, 29));

    // The upload file is named by the second, in the temporary directory.
    const qint64 before = QDateTime::currentSecsSinceEpoch();
    const QUrl url = activity->tempFileURL();
    const auto match =
        QRegularExpression(R"(^/private/var/mobile/Library/Tamsel//TXCapture_YouTube(\d+)\.mp4$)")
            .match(url.path());
    ASSERT_TRUE(url.isLocalFile() && match.hasMatch()) << url.toString().toStdString();
    EXPECT_GE(match.captured(1).toLongLong(), before);
    EXPECT_LE(match.captured(1).toLongLong(), QDateTime::currentSecsSinceEpoch());
    EXPECT_EQ(QFileInfo(DevicePaths::hostPathOfUrl(url)).absolutePath(),
              device.hostPath("Library/Tamsel"));
}

TEST_F(ActivityFixture, PreparingExportsAtHighestQualityWithEveryAudioTrackAndComposesTheText) {
    activity->prepareWithActivityItems({QStringLiteral("T"),
                                        QUrl(QStringLiteral("https://example.org/L?a=1")),
                                        QUrl::fromLocalFile(moviePath)});
    EXPECT_EQ(activity->descriptionText, "T https://example.org/L?a=1");
    ASSERT_EQ(exports.made.size(), 1);
    const auto& session = *exports.made[0];
    EXPECT_EQ(session.asset()->hostPath(), moviePath);
    EXPECT_EQ(session.presetName(), ExportPresetHighestQuality);
    EXPECT_EQ(session.outputURL(), activity->movieURL);
    EXPECT_TRUE(activity->movieURL.path().contains("/Tamsel//TXCapture_YouTube"));
    EXPECT_EQ(session.outputFileType(), FileTypeMPEG4);
    EXPECT_EQ(session.starts, 1);
    // One record per audio track, in the asset's order, levels untouched.
    const std::optional<AudioMix> mix = session.audioMix();
    ASSERT_TRUE(mix);
    QList<int> mixed, audioTracks;
    for (const AudioMixInputParameters& input : mix->inputParameters) {
        mixed.append(input.trackID);
        EXPECT_EQ(input.volume, 1.0f);
    }
    for (const AssetTrack& track : session.asset()->tracksWithMediaType(MediaType::Audio))
        audioTracks.append(track.trackID);
    EXPECT_EQ(audioTracks.size(), 2);
    EXPECT_EQ(mixed, audioTracks);
}

TEST_F(ActivityFixture, OnlyAnExportThatNeitherFailedNorWasCancelledIsLogged) {
    for (const auto status : {ExportSessionStatus::Failed, ExportSessionStatus::Cancelled,
                              ExportSessionStatus::Completed}) {
        activity->prepareWithActivityItems(items());
        exports.made.last()->finish(status);
    }
    EXPECT_EQ(log.count(LogLevel::Default,
                        QStringLiteral("TXYouTubeActivity: Export Mixed YouTube Video Complete.")),
              1);
}

TEST_F(ActivityFixture, ItemsWithoutAMovieGiveAnExportThatCannotSucceedNotACrash) {
    // A host's own share message and no attachment: the message and the
    // movie are the two texts, and there is no third item.
    activity->prepareWithActivityItems(
        {QStringLiteral("Look at this"), QUrl::fromLocalFile(moviePath)});
    EXPECT_EQ(activity->descriptionText,
              "Look at this " + QUrl::fromLocalFile(moviePath).toString(QUrl::FullyEncoded));
    ASSERT_EQ(exports.made.size(), 1);
    EXPECT_TRUE(exports.made[0]->asset()->tracks().isEmpty());
}

TEST_F(ActivityFixture, TheControllerIsTheAgentsStackWithTheDescriptionFilledIn) {
    const auto controller = pick();
    FakePublishingAgent* agent = FakePublishingAgent::last();
    ASSERT_TRUE(agent);
    EXPECT_EQ(activity->publishingAgent.get(), agent);
    EXPECT_EQ(controller, agent->navigationController());
    EXPECT_EQ(agent->delegate().get(), static_cast<TXPublishingAgentDelegate*>(activity.get()));
    EXPECT_EQ(agent->mediaPath, activity->movieURL.path());
    const FakeUploadForm& table = *form();
    EXPECT_EQ(table.description.value, "Check out my recording of Racer by Example Games! "
                                       "https://flathub.org/apps/org.example.Racer");
    EXPECT_EQ(table.description.placeholder, "");
    EXPECT_EQ(table.title.value, "");
    EXPECT_EQ(table.title.placeholder, "Title");

    // The plug-in is loaded once for the life of the process, from its path,
    // and its agent class found by name.
    auto second = TXYouTubeActivity::init();
    second->prepareWithActivityItems(items());
    EXPECT_TRUE(second->activityViewController());
    EXPECT_NE(second->publishingAgent, activity->publishingAgent);
    EXPECT_EQ(FakePluginLoader::asked,
              (QStringList{"load " + PublishingPlugin::youTubePluginPath,
                           "class " + PublishingPlugin::youTubeAgentClassName}));
}

// Each request for the controller exchanges the preselection code between
// the form's class and the activity: the odd ones put the activity's in place.
TEST_F(ActivityFixture, TheCategoryWithIdentifierTwentyIsPreselectedUntilTheNextRequest) {
    pick();
    FakeUploadForm* first = form();
    first->categoriesDidArrive({"10:Music", "20:Gaming", "22:People & Blogs"});
    EXPECT_EQ(first->calls, (QStringList{"category Gaming", "select 1 0 0"}));
    EXPECT_EQ(first->defaultCategory, "20");
    // Without the category, or without any, the form is left as it was.
    first->categoriesDidArrive({"1:Film", "2:Autos"});
    first->categoriesDidArrive({});
    EXPECT_EQ(first->calls.size(), 2);
    EXPECT_EQ(first->defaultCategory, "20");
    EXPECT_EQ(first->ownSelections, 0);

    FakePublishingAgent::nextFormHasMembers = false;
    activity->activityViewController();
    first->categoriesDidArrive({"10:Music", "20:Gaming"});
    EXPECT_EQ(first->ownSelections, 1) << "the second request swapped the form's own back";
    EXPECT_EQ(first->calls.size(), 2);

    // A form without its members is neither filled nor preselected, but shown.
    EXPECT_TRUE(activity->activityViewController());
    form()->categoriesDidArrive({"20:Gaming"});
    EXPECT_EQ(form()->ownSelections, 0);
    EXPECT_EQ(form()->description.value, "");
    EXPECT_EQ(form()->description.placeholder, "Description");
    EXPECT_TRUE(form()->calls.isEmpty());
}

// A device without the plug-in, or with one that lacks the agent class,
// stops the process when the activity first needs the agent.
TEST_F(ActivityFixture, AMissingPluginOrAgentClassStopsTheProcess) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    loader->agentClass = nullptr;
    EXPECT_DEATH(pick(), "Unable to find class YouTubePublishingAgent");
    loader->loadError = QStringLiteral("libtamsel-youtube-publishing.so: cannot open shared "
                                       "object file: No such file or directory");
    EXPECT_DEATH(pick(), "libtamsel-youtube-publishing.so: cannot open shared object file: No "
                         "such file or directory");
}

namespace {

// The sheet presents the agent's stack in the window; the upload file exists.
class PublishingFixture : public ActivityFixture {
  protected:
    void SetUp() override {
        window.setRootViewController(pick());
        window.resize(480, 640);
        window.show();
        window.activateWindow();
        ASSERT_TRUE(QTest::qWaitForWindowActive(&window));
        agent = FakePublishingAgent::last();
        writeFile(DevicePaths::hostPathOfUrl(activity->movieURL), 4096);
    }

    Alert* alert() const {
        return qobject_cast<Alert*>(agent->navigationController()->presentedViewController());
    }
    QStringList actionTitles() const {
        QStringList titles;
        for (const auto& action : alert()->actions())
            titles.append(action->title());
        return titles;
    }
    // Publishing ends as `error` says: the alert comes, and the upload file
    // goes while it is still up.
    void endWith(ErrorPtr error) {
        agent->pressPublish();
        ASSERT_TRUE(waitUntil([&] { return activity->progressOverlay->activityIndicator(); }));
        agent->endPublishing(error, kWatchURL);
        ASSERT_TRUE(alert());
        EXPECT_TRUE(uploadFileRemoved());
        EXPECT_FALSE(finished);
    }
    // A press on the alert's button with that title, as the user makes it;
    // what the activity finished with.
    std::optional<bool> press(const QString& title) {
        for (const auto& action : alert()->actions())
            if (action->title() == title)
                QTest::mouseClick(alert()->buttonForAction(action.get()), Qt::LeftButton);
        waitUntil([&] { return finished.has_value(); });
        EXPECT_EQ(finishes, 1);
        return finished;
    }
    bool uploadFileRemoved() const {
        return waitUntil(
            [&] { return !QFile::exists(DevicePaths::hostPathOfUrl(activity->movieURL)); });
    }

    Window window;
    FakePublishingAgent* agent = nullptr;
};

} // namespace

TEST_F(PublishingFixture, CancelFinishesAsNotCompletedAndRemovesTheUploadFile) {
    agent->pressCancel();
    EXPECT_EQ(finished, false);
    EXPECT_TRUE(uploadFileRemoved());
    EXPECT_EQ(exports.made.last()->cancels, 1) << "an export still writing the file stops";
    EXPECT_FALSE(alert());
}

TEST_F(PublishingFixture, PublishEndsEditingAndCoversTheAgentsScreenWithTheOverlay) {
    auto* field = new QLineEdit(form()->view());
    field->show();
    QString committed;
    QObject::connect(field, &QLineEdit::editingFinished, [&] { committed = field->text(); });
    field->setFocus();
    QTest::keyClicks(field, "My run");
    ASSERT_EQ(window.focusWidget(), field);
    agent->pressPublish();
    EXPECT_NE(window.focusWidget(), field);
    EXPECT_EQ(committed, "My run");

    View* screen = agent->navigationController()->view();
    ASSERT_TRUE(activity->progressOverlay);
    EXPECT_EQ(activity->progressOverlay->superview(), screen);
    EXPECT_EQ(activity->progressOverlay->frame(), screen->bounds());
    EXPECT_TRUE(activity->progressOverlay->isShowing());
    EXPECT_FALSE(finished);
}

TEST_F(PublishingFixture, AfterSuccessViewFinishesAsCompletedAndOpensTheVideo) {
    endWith(nullptr);
    EXPECT_EQ(alert()->title(), "Your video has been published.");
    EXPECT_EQ(alert()->message(), "");
    EXPECT_EQ(alert()->preferredStyle(), Alert::Style::Alert);
    EXPECT_EQ(actionTitles(), (QStringList{"View on YouTube", "Close"}));
    EXPECT_EQ(alert()->actions()[0]->style(), AlertAction::Style::Default);
    EXPECT_EQ(alert()->actions()[1]->style(), AlertAction::Style::Cancel);
    // The spinner stops; the dimming stays under the alert.
    EXPECT_NE(activity->progressOverlay->activityIndicator()->parentWidget(),
              activity->progressOverlay.get());
    EXPECT_TRUE(activity->progressOverlay->superview());
    EXPECT_EQ(press("View on YouTube"), true);
    EXPECT_EQ(browser.opened(), QList<QUrl>{QUrl(kWatchURL)});
    EXPECT_TRUE(waitUntil([&] { return !alert(); }));
}

TEST_F(PublishingFixture, AfterSuccessCloseFinishesAsNotCompletedInTheUsersLanguage) {
    ScopedEnv german("LANG", "de_DE.UTF-8");
    endWith(nullptr);
    EXPECT_EQ(alert()->title(), "Dein Video wurde veröffentlicht.");
    EXPECT_EQ(actionTitles(), (QStringList{"Auf YouTube ansehen", "Schließen"}));
    EXPECT_EQ(press("Schließen"), false);
    EXPECT_TRUE(browser.opened().isEmpty());
}

TEST_F(PublishingFixture, AfterFailureOnlyCloseIsOfferedAndItFinishesAsCompleted) {
    endWith(makeError(403, "YouTubeErrorDomain", "quotaExceeded"));
    EXPECT_EQ(alert()->title(), "Your video could not be published.");
    EXPECT_EQ(actionTitles(), QStringList{"Close"});
    EXPECT_EQ(press("Close"), true);
    EXPECT_TRUE(browser.opened().isEmpty());
}
