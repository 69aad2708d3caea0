// Construction and tear-down of the editor.

#include "EditorOnFakes.h"
#include "platform/media/playback/NotificationCenter.h"
#include "platform/runtime/DevicePaths.h"
#include "platform/services/ActivityTypes.h"

#include <QFile>

using namespace platform;

using EditorModel = EditorOnFakes;

TEST_F(EditorModel, ComesUpInIntroModeAndTakesTheWholeMovieOnceItsItemIsReady) {
    editor =
        TXVideoEditorViewController::initWithBundleIdentifier_URL_applicationName_overrideTintColor(
            "org.example.Racer", recording, "Racer", QColor(200, 30, 30));
    TXVideoEditorViewController& e = *editor;
    EXPECT_DOUBLE_EQ(e.editEndTime, 0.0);
    EXPECT_TRUE(e.avTrimmer->delegate().expired());
    EXPECT_TRUE(std::isnan(e.getPlayerDuration()));
    settle();

    EXPECT_TRUE(e.isIntroMode());
    EXPECT_FALSE(e.isUIHidden() || e.hasEdit() || e.isTrimming() || e.isExporting() ||
                 e.isScrubbing());
    EXPECT_TRUE(e.activityTypes.isEmpty());
    EXPECT_EQ(e.originalVideoURL, recording);
    EXPECT_EQ(e.videoURL, recording);
    EXPECT_EQ(e.titleLabel->text(), "Racer");
    EXPECT_EQ(e.topToolBar->tintColor(), QColor(200, 30, 30));
    EXPECT_FALSE(e.bottomToolBar->tintColor().isValid()) << "only the top bar takes the tint";
    EXPECT_EQ(e.videoOverlayPlayButtonView->parentWidget(), e.view());
    EXPECT_EQ(player().seeks(), QList<MediaTime>{MediaTime::zero()});
    EXPECT_EQ(player().rate(), 0.0f);
    EXPECT_DOUBLE_EQ(e.editStartTime, 0.0);
    EXPECT_DOUBLE_EQ(e.editEndTime, 10.0);
    EXPECT_EQ(e.avTrimmer->delegate().lock().get(), static_cast<MovieScrubberDelegate*>(&e));
    EXPECT_EQ(e.avTrimmer->dataSource().lock().get(), static_cast<MovieScrubberDataSource*>(&e));
}

TEST_F(EditorModel, AMovieThatFailsToLoadOrNoURLGivesAnEditorThatLeavesTheScrubberAlone) {
    for (const QUrl& url : {QUrl::fromLocalFile("/recordings/gone.mp4"), QUrl()}) {
        SCOPED_TRACE(url.toString().toStdString());
        editor = TXVideoEditorViewController::initWithBundleIdentifier_URL_applicationName(
            "org.example.Racer", url, "Racer");
        settle();
        EXPECT_TRUE(editor->isIntroMode());
        EXPECT_EQ(top(), "cancel | title | share - save");
        EXPECT_EQ(editor->avPlayer->currentItem()->status(), PlayerItem::Status::Failed);
        EXPECT_DOUBLE_EQ(editor->editEndTime, 0.0);
        EXPECT_TRUE(editor->avTrimmer->delegate().expired());
        EXPECT_TRUE(editor->avTrimmer->dataSource().expired());
        editor->undoAction(); // no delegate to send to: nothing happens
        EXPECT_FALSE(editor->isTrimming());
    }
}

TEST_F(EditorModel, TearDownStopsEveryObservationAndRemovesTheTrimmedClip) {
    makeEditor();
    const std::shared_ptr<Player> avPlayer = editor->avPlayer;
    const std::shared_ptr<PlayerItem> item = avPlayer->currentItem();
    auto& fake = player();
    const int observations = NotificationCenter::defaultCenter().observerCount();
    const QString trimmed = DevicePaths::hostPathOfUrl(editor->trimFilePath);
    QFile file(trimmed);
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.close();

    std::weak_ptr<TXVideoEditorViewController> weak = editor;
    editor.reset();
    drainQueues(); // thumbnails the scrubber asked for hold the editor until they land
    ASSERT_TRUE(weak.expired()) << "nothing keeps a dismissed editor alive";
    EXPECT_EQ(fake.periodicObserverCount(), 0);
    EXPECT_LT(NotificationCenter::defaultCenter().observerCount(), observations);

    // The player lives on here; nothing it does reaches the gone editor (a
    // status observer left behind would be called on freed memory).
    avPlayer->play();
    fake.advance(20);
    std::static_pointer_cast<fakes::FakePlayerItem>(item)->fail(nullptr);
    drainQueues();
    EXPECT_FALSE(QFile::exists(trimmed));
}

TEST_F(EditorModel, CancelAndDoneBothPauseAndReportTheLiveList) {
    makeEditor();
    EXPECT_FALSE(editor->topToolBar->tintColor().isValid());
    editor->activityTypes.append(MailActivityType);
    editor->avPlayer->play();
    editor->cancelButton->trigger();
    EXPECT_EQ(editor->avPlayer->rate(), 0.0f);
    editor->doneButton->trigger();
    EXPECT_EQ(delegate->reports, (QList<QStringList>(2, {MailActivityType})));
}
