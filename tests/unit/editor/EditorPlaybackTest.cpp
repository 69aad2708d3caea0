// Play, pause, the playhead, the end of the movie and reloading.

#include "EditorOnFakes.h"
#include "platform/media/playback/PlayerLayer.h"
#include "platform/ui/View.h"

using namespace platform;

using EditorPlayback = EditorOnFakes;

TEST_F(EditorPlayback, TheFirstPlayHidesTheChromeAndRetiresTheOverlayButtonForGood) {
    makeEditor();
    editor->playAction();
    EXPECT_EQ(player().rate(), 1.0f);
    EXPECT_TRUE(editor->isUIHidden());
    EXPECT_FALSE(editor->isIntroMode());
    EXPECT_EQ(editor->videoOverlayPlayButtonView->parentWidget(), nullptr);
    EXPECT_EQ(top(), "cancel | title | pause - share - save");

    editor->pauseAction();
    EXPECT_EQ(player().rate(), 0.0f);
    EXPECT_EQ(top(), "cancel | title | play - share - save");
    EXPECT_TRUE(editor->isUIHidden()) << "pausing does not bring the chrome back";
    EXPECT_EQ(editor->videoOverlayPlayButtonView->parentWidget(), nullptr);
}

TEST_F(EditorPlayback, ThePlayheadFollowsPlaybackExceptWhileTheUserHoldsIt) {
    makeEditor();
    editor->playAction();
    player().advance(1.5);
    settle();
    EXPECT_DOUBLE_EQ(editor->avTrimmer->value(), 1.5);

    editor->movieScrubberDidBeginScrubbing_withHandle(editor->avTrimmer.get(), {});
    EXPECT_TRUE(editor->isScrubbing());
    EXPECT_EQ(player().rate(), 0.0f) << "taking the playhead pauses";
    editor->avPlayer->play();
    player().advance(2);
    settle();
    EXPECT_DOUBLE_EQ(editor->avTrimmer->value(), 1.5) << "ticks leave a held playhead alone";
}

TEST_F(EditorPlayback, TheEndPausesBringsTheChromeBackAndRewindsForTheNextPlay) {
    makeEditor();
    editor->playAction();
    player().advance(11);
    settle();
    EXPECT_EQ(player().rate(), 0.0f);
    EXPECT_FALSE(editor->isUIHidden());
    EXPECT_EQ(top(), "cancel | title | play - share - save");
    EXPECT_EQ(player().seeks().last(), MediaTime::zero());
    EXPECT_DOUBLE_EQ(editor->avPlayer->currentTime().seconds(), 0.0);

    editor->playAction();
    player().advance(1);
    EXPECT_DOUBLE_EQ(editor->avPlayer->currentTime().seconds(), 1.0) << "a new play starts at zero";
}

TEST_F(EditorPlayback, WhileTrimmingPlayRunsFromTheStartHandleToTheEndHandle) {
    makeEditor();
    editor->movieScrubberDidBeginEditing(editor->avTrimmer.get());
    editor->editStartTime = 2.0;
    editor->editEndTime = 5.0;
    editor->movieScrubber_valueDidChange(editor->avTrimmer.get(), 8.0);
    settle();
    editor->playAction();
    EXPECT_EQ(player().seeks().last(), MediaTime::make(1200, 600));
    EXPECT_EQ(top(), "cancelTrim | title | pause - share - trim");
    settle();
    player().advance(2.5);
    settle();
    EXPECT_EQ(player().rate(), 1.0f);
    player().advance(1);
    settle();
    EXPECT_EQ(player().rate(), 0.0f) << "the end handle stops playback";
    EXPECT_EQ(top(), "cancelTrim | title | play - share - trim");

    // Each play adds a boundary of its own; the earlier one stays.
    editor->editEndTime = 7.0;
    editor->playAction();
    EXPECT_EQ(player().boundaryObserverCount(), 2);
}

TEST_F(EditorPlayback, ReloadingWhileTrimmingEndsTheEditAndTheNewMovieResetsTheRange) {
    const QUrl clip = QUrl::fromLocalFile("/recordings/clip.mp4");
    fakes.world().addMovie(clip, fakes::FakeMovie{4.0});
    makeEditor();
    editor->movieScrubberDidBeginEditing(editor->avTrimmer.get());
    editor->editStartTime = 1.0;
    editor->editEndTime = 3.0;
    const std::shared_ptr<Player> before = editor->avPlayer;

    editor->reloadAVLayerWithURL(clip);
    EXPECT_FALSE(editor->isTrimming());
    EXPECT_TRUE(top().starts_with("done ")) << "the edit was cancelled into preview";
    EXPECT_EQ(editor->videoURL, clip);
    EXPECT_NE(editor->avPlayer, before);
    EXPECT_EQ(editor->avPlayerLayer->player(), editor->avPlayer);
    EXPECT_EQ(editor->avPlayer->actionAtItemEnd(), Player::ActionAtItemEnd::Pause);
    EXPECT_DOUBLE_EQ(editor->editEndTime, 3.0) << "the range waits for the new item";

    settle();
    EXPECT_DOUBLE_EQ(editor->editStartTime, 0.0);
    EXPECT_DOUBLE_EQ(editor->editEndTime, 4.0);
    editor->playAction();
    player().advance(1);
    settle();
    EXPECT_DOUBLE_EQ(editor->avTrimmer->value(), 1.0) << "the playhead follows the new player";
}
