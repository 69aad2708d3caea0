// The wide and compact layouts, size transitions and the chrome's visibility.

#include "EditorOnFakes.h"
#include "platform/ui/Device.h"
#include "platform/ui/TransitionCoordinator.h"

using namespace platform;

using EditorLayout = EditorOnFakes;

TEST_F(EditorLayout, TheWideLayoutHasOneBarAndTheCompactOneTwo) {
    makeEditor();
    EXPECT_TRUE(editor->isPadMode());
    EXPECT_EQ(editor->bottomToolBar->superview(), nullptr);
    EXPECT_EQ(top(), "cancel | title | share - save")
        << "no play button in the toolbar while the overlay button is up";

    editor->applyPhoneUILayout();
    EXPECT_FALSE(editor->isPadMode());
    EXPECT_EQ(editor->bottomToolBar->superview(), editor->view());
    EXPECT_EQ(top(), "cancel | title | save");
    EXPECT_EQ(bottom(), "share |");

    // Play and pause change only the bottom bar.
    editor->playAction();
    EXPECT_EQ(bottom(), "share | pause |");
    editor->pauseAction();
    EXPECT_EQ(bottom(), "share | play |");
    EXPECT_EQ(top(), "cancel | title | save");

    editor->applyPadUILayout();
    EXPECT_EQ(editor->bottomToolBar->superview(), nullptr);
    EXPECT_EQ(top(), "cancel | title | play - share - save");
}

TEST_F(EditorLayout, APhoneFollowsTheWindowsShapeAndATransitionRemakesTheThumbnails) {
    Device::setInterfaceIdiomOverride(Device::InterfaceIdiom::Phone);
    makeEditor();
    const auto transition = [&](QSize size) {
        editor->view()->resize(size);
        auto coordinator = TransitionCoordinator::make(0, false);
        editor->viewWillTransitionToSize_withTransitionCoordinator(QSizeF(size), *coordinator);
        coordinator->run();
    };
    transition(QSize(400, 300));
    EXPECT_TRUE(editor->isPadMode()) << "a phone on its side gets the wide layout";

    editor->movieScrubber_requestThumbnailImageForTimestamp(editor->avTrimmer.get(), 1.0);
    const std::shared_ptr<ImageGenerator> old = editor->thumbnailGenerator;
    transition(QSize(300, 600));
    EXPECT_FALSE(editor->isPadMode());
    EXPECT_EQ(editor->bottomToolBar->superview(), editor->view());
    EXPECT_NE(editor->thumbnailGenerator, old) << "thumbnails are made again at the new size";
    EXPECT_EQ(editor->avPlayerLayer->frame(), QRect(0, 0, 300, 600));
    EXPECT_EQ(View::frameOf(editor->videoOverlayPlayButtonView.get()).center(), QPointF(150, 300))
        << "the play button stays in the middle of the window";
}

TEST_F(EditorLayout, ATapOnTheVideoTogglesTheChrome) {
    makeEditor();
    editor->handleSingleTap(nullptr);
    EXPECT_TRUE(editor->isUIHidden());
    editor->handleSingleTap(nullptr);
    EXPECT_FALSE(editor->isUIHidden());
}
