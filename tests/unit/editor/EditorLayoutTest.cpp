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
    EXPECT_EQ(topItems(), (QStringList{"cancelButton", "flexSpace", "titleButton", "flexSpace",
                                       "shareButton", "fixSpace", "saveButton"}))
        << "no play button in the toolbar while the overlay button is up";

    editor->applyPhoneUILayout();
    EXPECT_FALSE(editor->isPadMode());
    EXPECT_EQ(editor->bottomToolBar->superview(), editor->view());
    EXPECT_EQ(topItems(),
              (QStringList{"cancelButton", "flexSpace", "titleButton", "flexSpace", "saveButton"}));
    EXPECT_EQ(bottomItems(), (QStringList{"shareButton", "flexSpace"}));

    editor->playAction();
    editor->pauseAction();
    editor->applyPadUILayout();
    EXPECT_EQ(editor->bottomToolBar->superview(), nullptr);
    EXPECT_EQ(topItems(),
              (QStringList{"cancelButton", "flexSpace", "titleButton", "flexSpace", "playButton",
                           "fixSpace", "shareButton", "fixSpace", "saveButton"}));
}

TEST_F(EditorLayout, APhoneFollowsTheWindowsShapeAndATransitionRemakesTheThumbnails) {
    Device::setInterfaceIdiomOverride(Device::InterfaceIdiom::Phone);
    makeEditor();
    editor->view()->resize(400, 300);
    auto toWide = TransitionCoordinator::make(0, false);
    editor->viewWillTransitionToSize_withTransitionCoordinator(QSizeF(400, 300), *toWide);
    toWide->run();
    EXPECT_TRUE(editor->isPadMode()) << "a phone on its side gets the wide layout";

    editor->movieScrubber_requestThumbnailImageForTimestamp(editor->avTrimmer.get(), 1.0);
    const std::shared_ptr<ImageGenerator> old = editor->thumbnailGenerator;
    editor->view()->resize(300, 600);
    auto toTall = TransitionCoordinator::make(0, false);
    editor->viewWillTransitionToSize_withTransitionCoordinator(QSizeF(300, 600), *toTall);
    toTall->run();
    EXPECT_FALSE(editor->isPadMode());
    EXPECT_EQ(editor->bottomToolBar->superview(), editor->view());
    EXPECT_NE(editor->thumbnailGenerator, old) << "thumbnails are made again at the new size";
    EXPECT_EQ(editor->avPlayerLayer->frame(), QRect(0, 0, 300, 600));
}

TEST_F(EditorLayout, ATapOnTheVideoTogglesTheChrome) {
    makeEditor();
    editor->handleSingleTap(nullptr);
    EXPECT_TRUE(editor->isUIHidden());
    editor->handleSingleTap(nullptr);
    EXPECT_FALSE(editor->isUIHidden());
}
