// The activity from the sheet's side: identity, preparing the upload file and
// the form it hands back, pre-filled and with its category preselected.

#include "ActivityFixture.h"
#include "media/MediaFixtures.h"
#include "platform/media/Asset.h"
#include "platform/runtime/DevicePaths.h"
#include "platform/services/PublishingPlugin.h"
#include "platform/ui/NavigationController.h"

#include <QDateTime>
#include <QProcess>
#include <QRegularExpression>
#include <QStandardPaths>

using namespace platform;
using testing_support::ScopedEnv;

namespace {

// The test movie with its audio track twice, as a recorder writes a desktop
// and a microphone track; empty when ffmpeg is not there to make it.
QString movieWithTwoAudioTracks(const QString& source) {
    const QString ffmpeg = QStandardPaths::findExecutable(QStringLiteral("ffmpeg"));
    if (ffmpeg.isEmpty())
        return {};
    const QString output = mediatest::scratchPath(QStringLiteral("two-audio-tracks.mp4"));
    QProcess process;
    process.start(ffmpeg, {"-y", "-v", "error", "-i", source, "-i", source, "-map", "0:v", "-map",
                           "0:a", "-map", "1:a", "-c", "copy", output});
    if (!process.waitForFinished(60000) || process.exitCode() != 0)
        return {};
    return output;
}

} // namespace

TEST_F(ActivityFixture, IdentityIsFixedAndTheDeviceDecidesWhetherItCanPerform) {
    EXPECT_EQ(activity->activityType(), "TXPublishToYouTube");
    EXPECT_EQ(activity->activityTitle(), "YouTube");
    EXPECT_EQ(activity->activityCategory(), ActivityCategory::Share);
    EXPECT_TRUE(activity->canPerformWithActivityItems({}));
    {
        ScopedEnv off("TAMSEL_DISABLED_CAPABILITIES", "video-publishing");
        EXPECT_FALSE(activity->canPerformWithActivityItems(items()));
    }

    const QImage icon = activity->activityImage();
    ASSERT_FALSE(icon.isNull());
    EXPECT_EQ(icon.deviceIndependentSize(), QSizeF(48, 48));
    EXPECT_EQ(TXYouTubeActivity::photoUIBundle(), TXYouTubeActivity::photoUIBundle());

    // On a tile with rounded corners: the corner is clear, the middle drawn.
    const QImage settings = activity->_activitySettingsImage();
    EXPECT_EQ(settings.deviceIndependentSize(), QSizeF(29, 29));
    EXPECT_EQ(qAlpha(settings.pixel(0, 0)), 0);
    EXPECT_EQ(qAlpha(settings.pixel(settings.width() / 2, settings.height() / 2)), 255);
}

TEST_F(ActivityFixture, TheUploadFileIsNamedByTheSecondInTheTemporaryDirectory) {
    const qint64 before = QDateTime::currentSecsSinceEpoch();
    const QUrl url = activity->tempFileURL();
    const qint64 after = QDateTime::currentSecsSinceEpoch();

    ASSERT_TRUE(url.isLocalFile());
    const auto match =
        QRegularExpression(R"(^/private/var/mobile/Library/Tamsel//TXCapture_YouTube(\d+)\.mp4$)")
            .match(url.path());
    ASSERT_TRUE(match.hasMatch()) << url.path().toStdString();
    const qint64 seconds = match.captured(1).toLongLong();
    EXPECT_GE(seconds, before);
    EXPECT_LE(seconds, after);
    // The device path lands in the device's temporary directory here.
    EXPECT_EQ(QFileInfo(DevicePaths::hostPathOfUrl(url)).absolutePath(),
              device.hostPath("Library/Tamsel"));
}

TEST_F(ActivityFixture, PreparingExportsAtHighestQualityWithEveryAudioTrackAndComposesTheText) {
    const QString movie = movieWithTwoAudioTracks(moviePath);
    if (movie.isEmpty())
        GTEST_SKIP() << "ffmpeg is needed to make a movie with two audio tracks";
    activity->prepareWithActivityItems({QStringLiteral("T"),
                                        QUrl(QStringLiteral("https://example.org/L?a=1")),
                                        QUrl::fromLocalFile(movie)});

    EXPECT_EQ(activity->descriptionText, "T https://example.org/L?a=1");
    ASSERT_EQ(exports.made.size(), 1);
    const auto& session = *exports.made[0];
    EXPECT_EQ(session.asset()->hostPath(), movie);
    EXPECT_EQ(session.presetName(), ExportPresetHighestQuality);
    EXPECT_EQ(session.outputURL(), activity->movieURL);
    EXPECT_TRUE(activity->movieURL.path().contains("/Tamsel//TXCapture_YouTube"));
    EXPECT_EQ(session.outputFileType(), FileTypeMPEG4);
    EXPECT_EQ(session.starts, 1);

    // One record per audio track, in the asset's order, levels untouched.
    const std::optional<AudioMix> mix = session.audioMix();
    ASSERT_TRUE(mix);
    QList<int> mixed;
    for (const AudioMixInputParameters& input : mix->inputParameters) {
        mixed.append(input.trackID);
        EXPECT_EQ(input.volume, 1.0f);
    }
    QList<int> audioTracks;
    const auto asset = session.asset();
    for (const AssetTrack& track : asset->tracksWithMediaType(MediaType::Audio))
        audioTracks.append(track.trackID);
    EXPECT_EQ(audioTracks.size(), 2);
    EXPECT_EQ(mixed, audioTracks);
}

TEST_F(ActivityFixture, OnlyAnExportThatNeitherFailedNorWasCancelledIsLogged) {
    const QString line = QStringLiteral("TXYouTubeActivity: Export Mixed YouTube Video Complete.");
    for (const auto status : {ExportSessionStatus::Failed, ExportSessionStatus::Cancelled,
                              ExportSessionStatus::Completed}) {
        activity->prepareWithActivityItems(items());
        exports.made.last()->finish(status);
    }
    EXPECT_EQ(log.count(LogLevel::Default, line), 1);
    EXPECT_EQ(log.count(line), 1);
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
    EXPECT_EQ(exports.made[0]->outputURL(), activity->movieURL);
}

TEST_F(ActivityFixture, TheControllerIsTheAgentsStackWithTheDescriptionFilledIn) {
    const auto controller = pick();
    FakePublishingAgent* agent = FakePublishingAgent::last();
    ASSERT_TRUE(agent);
    EXPECT_EQ(activity->publishingAgent.get(), agent);
    EXPECT_EQ(controller, agent->navigationController());
    EXPECT_EQ(agent->delegateSets, 1);
    EXPECT_EQ(agent->delegate().get(), static_cast<TXPublishingAgentDelegate*>(activity.get()));
    EXPECT_EQ(agent->mediaPath, activity->movieURL.path());

    FakeUploadForm* form = agent->form();
    EXPECT_EQ(form->table_.descriptionCell.value,
              "Check out my recording of Racer by Example Games! "
              "https://flathub.org/apps/org.example.Racer");
    EXPECT_EQ(form->table_.descriptionCell.placeholder, "");
    EXPECT_EQ(form->table_.titleCell.value, "");
    EXPECT_EQ(form->table_.titleCell.placeholder, "Title");

    // The plug-in is loaded once for the life of the process, from its path,
    // and its agent class found by name.
    auto second = TXYouTubeActivity::init();
    second->prepareWithActivityItems(items());
    EXPECT_TRUE(second->activityViewController());
    EXPECT_NE(second->publishingAgent, activity->publishingAgent);
    EXPECT_EQ(FakePluginLoader::loads.load(), 1);
    EXPECT_EQ(FakePluginLoader::loadedPaths, QStringList{PublishingPlugin::youTubePluginPath});
    EXPECT_EQ(FakePluginLoader::lookedUp, QStringList{PublishingPlugin::youTubeAgentClassName});
}

TEST_F(ActivityFixture, TheCategoryWithIdentifierTwentyIsPreselected) {
    pick();
    FakeUploadForm* form = FakePublishingAgent::last()->form();

    form->categoriesDidArrive(
        {category("10", "Music"), category("20", "Gaming"), category("22", "People & Blogs")});
    EXPECT_EQ(form->ownSelections, 0);
    EXPECT_EQ(form->picker_.selections, (QList<std::tuple<int, int, bool>>{{1, 0, false}}));
    EXPECT_EQ(form->categoryCell_.categoryStrings, QStringList{"Gaming"});
    EXPECT_EQ(form->defaultCategory, "20");

    // Without the category, or without any, the form is left as it was.
    form->categoriesDidArrive({category("1", "Film"), category("2", "Autos")});
    form->categoriesDidArrive({});
    EXPECT_EQ(form->picker_.selections.size(), 1);
    EXPECT_EQ(form->categoryCell_.categoryStrings.size(), 1);
    EXPECT_EQ(form->defaultCategory, "20");
    EXPECT_EQ(form->ownSelections, 0);
}

TEST_F(ActivityFixture, ASecondControllerRequestSwapsThePreselectionBackToTheFormsOwn) {
    pick();
    FakeUploadForm* first = FakePublishingAgent::last()->form();
    activity->activityViewController();
    FakeUploadForm* second = FakePublishingAgent::last()->form();
    ASSERT_NE(first, second);

    const QVariantList categories{category("10", "Music"), category("20", "Gaming")};
    first->categoriesDidArrive(categories);
    second->categoriesDidArrive(categories);
    EXPECT_EQ(first->ownSelections, 1);
    EXPECT_EQ(second->ownSelections, 1);
    EXPECT_TRUE(first->picker_.selections.isEmpty());
    EXPECT_TRUE(second->picker_.selections.isEmpty());
    EXPECT_EQ(second->defaultCategory, "22");
}

TEST_F(ActivityFixture, AFormWithoutItsMembersIsNeitherFilledNorPreselectedButStillShown) {
    FakePublishingAgent::nextFormHasMembers = false;
    const auto controller = pick();
    ASSERT_TRUE(controller);
    FakeUploadForm* form = FakePublishingAgent::last()->form();
    EXPECT_EQ(form->table_.descriptionCell.value, "");
    EXPECT_EQ(form->table_.descriptionCell.placeholder, "Description");

    form->categoriesDidArrive({category("20", "Gaming")});
    EXPECT_TRUE(form->picker_.selections.isEmpty());
    EXPECT_TRUE(form->categoryCell_.categoryStrings.isEmpty());
    EXPECT_EQ(form->ownSelections, 0);
}
