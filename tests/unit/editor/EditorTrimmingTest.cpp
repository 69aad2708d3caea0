// The scrubber's callbacks: scrubbing, the trim handles, edit and preview
// modes, undo and shake.

#include "EditorOnFakes.h"
#include "platform/ui/MotionEvent.h"

using namespace platform;

using EditorTrimming = EditorOnFakes;

TEST_F(EditorTrimming, AHandleMovePausesOnItsFrameButLeavesThePauseButton) {
    makeEditor();
    editor->movieScrubberDidBeginEditing(editor->avTrimmer.get());
    EXPECT_TRUE(editor->isTrimming());
    EXPECT_TRUE(editor->hasEdit());
    EXPECT_EQ(top(), "cancelTrim | title | play - trim");
    editor->playAction();
    settle();

    const int seeks = player().seeks().size();
    editor->movieScrubber_editingStartValueDidChange(editor->avTrimmer.get(), 3.0);
    EXPECT_EQ(player().rate(), 0.0f);
    EXPECT_DOUBLE_EQ(editor->editStartTime, 3.0);
    EXPECT_EQ(top(), "cancelTrim | title | pause - share - trim");
    EXPECT_EQ(player().seeks().size(), seeks) << "the seek waits for the callback to return";
    settle();
    EXPECT_EQ(player().seeks().last(), MediaTime::make(1800, 600));

    editor->movieScrubber_editingEndValueDidChange(editor->avTrimmer.get(), 6.5);
    settle();
    EXPECT_DOUBLE_EQ(editor->editEndTime, 6.5);
    EXPECT_EQ(player().seeks().last(), MediaTime::make(3900, 600));
}

TEST_F(EditorTrimming, CancellingKeepsTheRangeAndPutsDoneInPlaceOfCancelForGood) {
    makeEditor();
    editor->movieScrubberDidBeginEditing(editor->avTrimmer.get());
    editor->movieScrubber_editingStartValueDidChange(editor->avTrimmer.get(), 2.0);
    editor->cancelTrimButton->trigger();
    EXPECT_FALSE(editor->isTrimming());
    EXPECT_FALSE(editor->avTrimmer->isEditing());
    EXPECT_EQ(top(), "done | title | play - share - save");
    EXPECT_DOUBLE_EQ(editor->editStartTime, 2.0);
    EXPECT_DOUBLE_EQ(editor->editEndTime, 10.0);

    // On the phone: edit mode has no share or save, and trim at the top right.
    editor->applyPhoneUILayout();
    editor->movieScrubberDidBeginEditing(editor->avTrimmer.get());
    EXPECT_EQ(bottom(), "| play |");
    EXPECT_EQ(top(), "cancelTrim | title | trim");
    editor->undoAction();
    EXPECT_EQ(bottom(), "share | play |");
    EXPECT_EQ(top(), "done | title | save");
}

TEST_F(EditorTrimming, UndoAndShakeWaitUntilNoExportRuns) {
    makeEditor();
    const MotionEvent shake{MotionEvent::Type::Motion, MotionEvent::Subtype::MotionShake};
    editor->motionEnded_withEvent(MotionEvent::Subtype::MotionShake, shake);
    EXPECT_FALSE(editor->isTrimming()) << "a shake outside trimming does nothing";

    editor->movieScrubberDidBeginEditing(editor->avTrimmer.get());
    editor->setExporting(true);
    editor->undoAction();
    editor->motionEnded_withEvent(MotionEvent::Subtype::MotionShake, shake);
    EXPECT_TRUE(editor->isTrimming());
    EXPECT_EQ(top(), "cancelTrim | title | play - trim");

    editor->setExporting(false);
    editor->motionEnded_withEvent(MotionEvent::Subtype::MotionShake, shake);
    EXPECT_FALSE(editor->isTrimming());
}

TEST_F(EditorTrimming, ScrubbingSeeksAndLeavesThePlayerPausedWhereItWasLetGo) {
    makeEditor();
    editor->playAction();
    editor->movieScrubberDidBeginScrubbing_withHandle(editor->avTrimmer.get(), {});
    EXPECT_EQ(player().rate(), 0.0f);
    EXPECT_EQ(top(), "cancel | title | play - share - save");
    editor->movieScrubber_valueDidChange(editor->avTrimmer.get(), 4.0);
    EXPECT_EQ(player().seeks().last(), MediaTime::make(2400, 600));

    editor->avTrimmer->setValue(6.0);
    editor->movieScrubberDidEndScrubbing_withHandle(editor->avTrimmer.get(), {});
    EXPECT_FALSE(editor->isScrubbing());
    EXPECT_EQ(player().seeks().last(), MediaTime::make(3600, 600));
    EXPECT_EQ(player().rate(), 0.0f);
    settle();

    editor->playAction();
    player().advance(0.5);
    EXPECT_DOUBLE_EQ(editor->avPlayer->currentTime().seconds(), 6.5)
        << "preview plays on from there";
}
