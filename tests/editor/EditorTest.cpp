// The editor on real widgets, a real player and a generated recording.

#include "EditorFixture.h"
#include "platform/media/playback/NotificationCenter.h"
#include "platform/runtime/DevicePaths.h"
#include "platform/runtime/GlobalQueue.h"
#include "platform/services/ActivityTypes.h"
#include "support/Wait.h"

#include <QDateTime>
#include <QDir>
#include <QFile>

using namespace platform;
using testing_support::waitUntil;

namespace {

// The editor's items by their property names, for readable comparisons.
QStringList names(TXVideoEditorViewController& e,
                  const QList<std::shared_ptr<ToolbarItem>>& items) {
    const QList<std::pair<const char*, std::shared_ptr<ToolbarItem>>> table = {
        {"shareButton", e.shareButton},
        {"pauseButton", e.pauseButton},
        {"saveButton", e.saveButton},
        {"flexSpace", e.flexSpace},
        {"doneButton", e.doneButton},
        {"cancelButton", e.cancelButton},
        {"cancelTrimButton", e.cancelTrimButton},
        {"trimButton", e.trimButton},
        {"titleButton", e.titleButton},
        {"playButton", e.playButton},
        {"fixSpace", e.fixSpace}};
    QStringList out;
    for (const auto& item : items)
        for (const auto& [name, candidate] : table)
            if (candidate == item)
                out.append(name);
    return out;
}

QStringList albumOf(const QTemporaryDir& album) {
    return QDir(album.path()).entryList(QDir::Files | QDir::NoDotAndDotDot);
}

} // namespace

TEST_F(EditorTest, ComesUpInIntroModeWithEverythingAtRest) {
    ASSERT_TRUE(makeEditor());
    TXVideoEditorViewController& e = *editor;
    EXPECT_TRUE(e.isIntroMode());
    EXPECT_FALSE(e.isUIHidden());
    EXPECT_FALSE(e.hasEdit());
    EXPECT_FALSE(e.isTrimming() || e.isExporting() || e.isScrubbing());
    EXPECT_TRUE(e.activityTypes.isEmpty());
    EXPECT_DOUBLE_EQ(e.editStartTime, 0.0);
    EXPECT_NEAR(e.editEndTime, 10.0, 0.1)
        << "the range becomes the whole movie once the item is ready";
    EXPECT_EQ(e.originalVideoURL, e.videoURL);
    EXPECT_EQ(e.titleLabel->text(), "Racer");
    ASSERT_TRUE(e.videoOverlayPlayButtonView);
    EXPECT_EQ(e.videoOverlayPlayButtonView->parentWidget(), e.view())
        << "the play button stands over the video";

    // A tablet: the wide layout, with the intro lists.
    EXPECT_TRUE(e.isPadMode());
    EXPECT_EQ(names(e, e.topToolBar->items()),
              (QStringList{"cancelButton", "flexSpace", "titleButton", "flexSpace", "shareButton",
                           "fixSpace", "saveButton"}));
    EXPECT_EQ(e.bottomToolBar->superview(), nullptr);
}

TEST_F(EditorTest, OnlyTheTopBarTakesTheTint) {
    ASSERT_TRUE(makeEditor(QString(), QColor(200, 30, 30)));
    EXPECT_EQ(editor->topToolBar->tintColor(), QColor(200, 30, 30));
    EXPECT_FALSE(editor->bottomToolBar->tintColor().isValid());

    auto plain = TXVideoEditorViewController::initWithBundleIdentifier_URL_applicationName(
        "org.example.Racer", QUrl::fromLocalFile(landscape()), "Racer");
    EXPECT_FALSE(plain->topToolBar->tintColor().isValid());
    EXPECT_FALSE(plain->bottomToolBar->tintColor().isValid());
}

TEST_F(EditorTest, TimeStampsAreEvenlySpacedAndStopPastTheDuration) {
    ASSERT_TRUE(makeEditor());
    auto stamps = [&](int n, double s, double e) {
        return editor->movieScrubber_evenlySpacedTimestamps_startingAt_endingAt(
            editor->avTrimmer.get(), n, s, e);
    };
    EXPECT_EQ(stamps(10, 0.0, 0.0), QList<double>{0.0});
    EXPECT_EQ(stamps(10, 0.0, 10.0), (QList<double>{0, 1, 2, 3, 4, 5, 6, 7, 8, 9}));
    EXPECT_EQ(stamps(10, 0.0, 20.0), (QList<double>{0, 2, 4, 6, 8, 10}))
        << "10 is kept: it is not past the end";
    EXPECT_TRUE(stamps(0, 0.0, 10.0).isEmpty());
}

TEST_F(EditorTest, AQuarterTurnSwapsTheVideoSize) {
    ASSERT_TRUE(makeEditor(portrait()));
    EXPECT_EQ(editor->getVideoSize(), QSizeF(240, 320));
    EXPECT_LT(editor->movieScrubberThumbnailAspectRatio(editor->avTrimmer.get()), 1.0f);
    const qreal k = editor->view()->devicePixelRatioF();
    EXPECT_EQ(editor->getThumbnailSize(), QSizeF(std::rint(0.75 * 38 * k) * k, 38 * k));

    ASSERT_TRUE(makeEditor());
    EXPECT_EQ(editor->getVideoSize(), QSizeF(320, 240));
    EXPECT_FLOAT_EQ(editor->movieScrubberThumbnailAspectRatio(editor->avTrimmer.get()),
                    320.0f / 240.0f);
}

TEST_F(EditorTest, TheTrimmedFileIsNamedAfterTheAppAndTheWholeSecond) {
    ASSERT_TRUE(makeEditor());
    const qint64 before = QDateTime::currentSecsSinceEpoch();
    const QString path = editor->trimFileURL().toLocalFile();
    const qint64 after = QDateTime::currentSecsSinceEpoch();
    ASSERT_TRUE(path.startsWith("/private/var/mobile/Library/Tamsel//Racer_"))
        << path.toStdString();
    ASSERT_TRUE(path.endsWith(".mp4"));
    const qint64 seconds = path.mid(QString("/private/var/mobile/Library/Tamsel//Racer_").size())
                               .chopped(4)
                               .toLongLong();
    EXPECT_GE(seconds, before);
    EXPECT_LE(seconds, after);
}

TEST_F(EditorTest, AnUntrimmedSaveReportsFirstAndRecordsEachPress) {
    ASSERT_TRUE(makeEditor());
    editor->saveAction();
    ASSERT_EQ(delegate->reports.size(), 1) << "the delegate hears of the save before it starts";
    EXPECT_EQ(delegate->reports[0], QStringList{SaveToAlbumActivityType});
    editor->saveAction();
    EXPECT_EQ(editor->activityTypes,
              (QStringList{SaveToAlbumActivityType, SaveToAlbumActivityType}));
    GlobalQueue::drain();
    EXPECT_EQ(albumOf(album), (QStringList{"landscape 2.mp4", "landscape.mp4"}));
}

TEST_F(EditorTest, ATrimmedSaveExportsFromTheStartForTheEndHandlesLength) {
    ASSERT_TRUE(makeEditor());
    editor->movieScrubberDidBeginEditing(editor->avTrimmer.get());
    editor->editStartTime = 2.0;
    editor->editEndTime = 5.0;
    editor->saveAction();
    EXPECT_TRUE(editor->isExporting());
    ASSERT_TRUE(waitUntil([&] { return !editor->isExporting(); }, 30000));
    EXPECT_TRUE(delegate->reports.isEmpty()) << "a trimmed save keeps the editor open";
    EXPECT_FALSE(editor->isTrimming()) << "loading the clip ended the trim edit";
    EXPECT_EQ(editor->videoURL, editor->trimFilePath);
    ASSERT_TRUE(waitUntil([&] {
        return editor->avPlayer->currentItem()->status() == PlayerItem::Status::ReadyToPlay;
    }));
    // From 2 s for 5 s: to 7 s.
    EXPECT_NEAR(editor->avPlayer->currentItem()->asset()->duration().seconds(), 5.0, 0.1);
    GlobalQueue::drain();
    EXPECT_EQ(albumOf(album).size(), 1);
}

TEST_F(EditorTest, PlayingWhileTrimmingRunsTheRangeAndStopsAtItsEnd) {
    ASSERT_TRUE(makeEditor());
    editor->movieScrubberDidBeginEditing(editor->avTrimmer.get());
    editor->editStartTime = 1.0;
    editor->editEndTime = 1.6;
    editor->playAction();
    EXPECT_FALSE(editor->isIntroMode());
    EXPECT_TRUE(editor->isUIHidden());
    EXPECT_TRUE(editor->topToolBar->items().contains(editor->pauseButton));
    ASSERT_TRUE(waitUntil([&] { return editor->avPlayer->rate() == 0; }, 10000));
    EXPECT_NEAR(editor->avPlayer->currentTime().seconds(), 1.6, 0.15);
    EXPECT_TRUE(editor->topToolBar->items().contains(editor->playButton));
    EXPECT_EQ(editor->videoOverlayPlayButtonView->parentWidget(), nullptr)
        << "the overlay button is gone for good";
}

TEST_F(EditorTest, EditAndPreviewModesRewriteTheToolbars) {
    ASSERT_TRUE(makeEditor());
    TXVideoEditorViewController& e = *editor;
    e.movieScrubberDidBeginEditing(e.avTrimmer.get());
    EXPECT_TRUE(e.hasEdit());
    EXPECT_EQ(names(e, e.topToolBar->items()),
              (QStringList{"cancelTrimButton", "flexSpace", "titleButton", "flexSpace",
                           "playButton", "fixSpace", "trimButton"}));

    e.setExporting(true);
    e.undoAction();
    EXPECT_TRUE(e.isTrimming()) << "no undo under a running export";
    e.setExporting(false);
    e.cancelTrimButton->trigger();
    EXPECT_FALSE(e.isTrimming());
    EXPECT_EQ(e.topToolBar->items().first(), e.doneButton) << "done replaces cancel for good";

    e.applyPhoneUILayout();
    EXPECT_FALSE(e.isPadMode());
    EXPECT_EQ(e.bottomToolBar->superview(), e.view());
    e.movieScrubberDidBeginEditing(e.avTrimmer.get());
    EXPECT_EQ(names(e, e.bottomToolBar->items()),
              (QStringList{"flexSpace", "playButton", "flexSpace"}));
    EXPECT_EQ(
        names(e, e.topToolBar->items()),
        (QStringList{"cancelTrimButton", "flexSpace", "titleButton", "flexSpace", "trimButton"}));
}

TEST_F(EditorTest, CancelReportsExactlyAsDoneDoes) {
    ASSERT_TRUE(makeEditor());
    editor->activityTypes.append(MailActivityType);
    editor->cancelButton->trigger();
    editor->doneButton->trigger();
    ASSERT_EQ(delegate->reports.size(), 2);
    EXPECT_EQ(delegate->reports[0], delegate->reports[1]);
    EXPECT_EQ(delegate->reports[0], QStringList{MailActivityType});
}

TEST_F(EditorTest, TearDownRemovesTheTrimmedFileAndEveryObservation) {
    ASSERT_TRUE(makeEditor());
    const int observersWithEditor = NotificationCenter::defaultCenter().observerCount();
    const QString trimmed = DevicePaths::hostPathOfUrl(editor->trimFilePath);
    QFile file(trimmed);
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write("clip");
    file.close();

    std::weak_ptr<TXVideoEditorViewController> weak = editor;
    editor.reset();
    ASSERT_TRUE(waitUntil([&] { return weak.expired(); }))
        << "nothing keeps a dismissed editor alive";
    GlobalQueue::drain();
    EXPECT_FALSE(QFile::exists(trimmed));
    EXPECT_LT(NotificationCenter::defaultCenter().observerCount(), observersWithEditor)
        << "the end-of-play observation went with the editor";
}
