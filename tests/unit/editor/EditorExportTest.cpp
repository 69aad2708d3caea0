// Saving: the untrimmed recording to the album, the trimmed range through an
// export, and what a failed export leaves behind.

#include "EditorOnFakes.h"
#include "platform/services/ActivityTypes.h"

#include <QDateTime>

using namespace platform;

class EditorExport : public EditorOnFakes {
  protected:
    void trim(double start, double end) {
        editor->movieScrubberDidBeginEditing(editor->avTrimmer.get());
        editor->movieScrubber_editingStartValueDidChange(editor->avTrimmer.get(), start);
        editor->movieScrubber_editingEndValueDidChange(editor->avTrimmer.get(), end);
    }
    QStringList imports() const { return fakes.world().state().albumImports; }
};

TEST_F(EditorExport, AnUntrimmedSaveTellsTheDelegateFirstThenImportsTheRecording) {
    makeEditor();
    editor->saveAction();
    ASSERT_EQ(delegate->reports.size(), 1) << "the delegate hears of the save before it starts";
    EXPECT_EQ(delegate->reports[0], QStringList{SaveToAlbumActivityType});
    editor->saveAction();
    EXPECT_EQ(editor->activityTypes, QStringList(2, SaveToAlbumActivityType));
    drainQueues();
    EXPECT_EQ(imports(), QStringList(2, recording.toLocalFile()));
    EXPECT_TRUE(fakes.world().state().exports.isEmpty());

    editor->videoURL = QUrl::fromLocalFile("/recordings/gone.mp4");
    editor->saveAction();
    drainQueues();
    EXPECT_EQ(log.count(LogLevel::Error, "Error writing video to camera roll: 3302"), 1);
}

TEST_F(EditorExport, ATrimmedSaveExportsFromTheStartForTheEndHandlesLengthThenPlaysTheClip) {
    makeEditor();
    trim(2.0, 5.0);
    const qint64 before = QDateTime::currentSecsSinceEpoch();
    editor->trimButton->trigger();
    EXPECT_TRUE(editor->isExporting());
    EXPECT_EQ(editor->activityTypes, QStringList{SaveToAlbumActivityType});
    drainQueues();

    ASSERT_EQ(fakes.world().state().exports.size(), 1);
    const fakes::FakeWorld::Export exported = fakes.world().state().exports.first();
    EXPECT_EQ(exported.source, recording);
    EXPECT_EQ(exported.presetName, ExportPresetPassthrough);
    EXPECT_EQ(exported.fileType, FileTypeMPEG4);
    EXPECT_EQ(exported.range.start, MediaTime::make(1200, 600));
    EXPECT_EQ(exported.range.duration, MediaTime::make(3000, 600))
        << "the end handle is the length";
    EXPECT_EQ(exported.output, editor->trimFilePath);
    const QString name = exported.output.toLocalFile();
    ASSERT_TRUE(name.startsWith("/private/var/mobile/Library/Tamsel//Racer_"))
        << name.toStdString();
    const qint64 seconds = name.section('_', -1).chopped(4).toLongLong();
    EXPECT_GE(seconds, before);
    EXPECT_LE(seconds, QDateTime::currentSecsSinceEpoch());

    EXPECT_FALSE(editor->isExporting());
    EXPECT_FALSE(editor->isTrimming()) << "loading the clip ended the trim edit";
    EXPECT_TRUE(delegate->reports.isEmpty()) << "a trimmed save keeps the editor open";
    EXPECT_EQ(imports(), QStringList{name});
    EXPECT_EQ(editor->videoURL, exported.output);
    EXPECT_EQ(editor->avPlayer->currentItem()->url(), exported.output);
    EXPECT_DOUBLE_EQ(editor->editEndTime, 5.0) << "2 s to 7 s of a ten-second movie";

    // The end of the clip is observed like the recording's was.
    editor->playAction();
    player().advance(6);
    settle();
    EXPECT_FALSE(editor->isUIHidden());
    EXPECT_EQ(player().seeks().last(), MediaTime::zero());
}

TEST_F(EditorExport, AFailedOrCancelledExportLeavesTheEditorExportingAndNoMediaFileAnywhere) {
    const struct {
        ExportSessionStatus outcome;
        LogLevel level;
        const char* line;
    } cases[] = {
        {ExportSessionStatus::Failed, LogLevel::Error,
         "TQVideoEditorViewController: Export Trim Video Failed, due to error: -28"},
        {ExportSessionStatus::Cancelled, LogLevel::Default,
         "TQVideoEditorViewController: Export Trim Video Cancelled"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.line);
        fakes.world().change([&](auto& world) {
            world.exportStatus = c.outcome;
            world.exportError = -28;
        });
        makeEditor();
        trim(1.0, 4.0);
        editor->saveAction();
        drainQueues();

        EXPECT_EQ(log.count(c.level, c.line), 1);
        EXPECT_TRUE(editor->isExporting());
        EXPECT_TRUE(editor->isTrimming());
        EXPECT_EQ(editor->videoURL, recording) << "the player keeps the untrimmed recording";
        EXPECT_EQ(editor->activityTypes, QStringList{SaveToAlbumActivityType});
        EXPECT_TRUE(imports().isEmpty());
        EXPECT_TRUE(filesOnDevice().isEmpty()) << filesOnDevice().join(", ").toStdString();
        editor->undoAction();
        EXPECT_TRUE(editor->isTrimming()) << "no undo for the rest of the editor's life";
    }
}
