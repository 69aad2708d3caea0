// The editor's keyboard on the real editor over fake media: keys typed into its window go
// through the buttons' actions and the scrubber's calls.

#include "EditorKeyboard.h"
#include "platform/ui/Window.h"
#include "support/Wait.h"
#include "unit/editor/EditorOnFakes.h"

#include <QApplication>
#include <QKeyEvent>

using namespace platform;
using testing_support::waitUntil;

namespace {

class EditorKeyboardTest : public EditorOnFakes {
  protected:
    // The editor in a window of its own with the keyboard installed (which
    // belongs to the window).
    void SetUp() override {
        EditorOnFakes::SetUp();
        makeEditor();
        window = std::make_unique<Window>();
        window->resize(960, 600);
        window->setRootViewController(editor);
        window->show();
        (new EditorKeyboard(window.get(), [this] { return editor.get(); }))->editorDidAppear();
    }

    void TearDown() override {
        window.reset();
        EditorOnFakes::TearDown();
    }

    // A key as the user types it: to the focused control, which passes on
    // what it does not take.
    void type(int key, Qt::KeyboardModifiers modifiers = Qt::NoModifier) {
        QWidget* target = window->focusWidget() ? window->focusWidget() : window.get();
        const QString text = key == Qt::Key_Space ? QStringLiteral(" ") : QString();
        QKeyEvent press(QEvent::KeyPress, key, modifiers, text);
        QApplication::sendEvent(target, &press);
        QKeyEvent release(QEvent::KeyRelease, key, modifiers, text);
        QApplication::sendEvent(window->focusWidget() ? window->focusWidget() : window.get(),
                                &release);
    }

    bool topBarHolds(const std::shared_ptr<ToolbarItem>& item) {
        return editor->topToolBar->items().contains(item);
    }
    bool playing() { return editor->avPlayer->rate() != 0; }
    double playhead() { return editor->avTrimmer->value(); }

    std::unique_ptr<Window> window;
};

} // namespace

TEST_F(EditorKeyboardTest, SpacePlaysAndPausesAndAFocusedButtonKeepsTheKeys) {
    ASSERT_TRUE(editor->isIntroMode());
    ASSERT_FALSE(topBarHolds(editor->playButton)) << "in intro only the overlay plays";

    type(Qt::Key_Space); // the pause button is faded out with the chrome
    ASSERT_TRUE(waitUntil([&] { return playing(); }));
    type(Qt::Key_Space);
    EXPECT_FALSE(playing());
    EXPECT_FALSE(editor->isUIHidden()) << "the chrome comes back as a tap brings it";
    ASSERT_TRUE(topBarHolds(editor->playButton));

    const auto widget = [&](const std::shared_ptr<ToolbarItem>& item) {
        return editor->topToolBar->widgetForItem(item.get());
    };
    widget(editor->playButton)->setFocus(Qt::TabFocusReason);
    type(Qt::Key_Space);
    EXPECT_TRUE(waitUntil([&] { return playing(); }));
    EXPECT_TRUE(editor->isUIHidden());
    EXPECT_EQ(window->focusWidget(), widget(editor->pauseButton)) << "play became pause in place";
    // The focused pause button has faded out with the chrome: its key shows
    // the chrome again and presses it.
    type(Qt::Key_Space);
    EXPECT_FALSE(playing());
    EXPECT_FALSE(editor->isUIHidden());
    EXPECT_EQ(window->focusWidget(), widget(editor->playButton));
    // A focused toolbar button leaves the arrows to the movie.
    const double before = playhead();
    type(Qt::Key_Right);
    EXPECT_NEAR(playhead(), before + 1.0 / 30.0, 0.02);
}

// Seconds, and I and O at the playhead, are the end-to-end keyboard test's.
TEST_F(EditorKeyboardTest, ArrowsStepFramesAndTheRangeKeepsItsLeastLength) {
    const double frame = 1.0 / 30.0;
    type(Qt::Key_Right);
    type(Qt::Key_Right);
    type(Qt::Key_Left);
    EXPECT_NEAR(playhead(), frame, 1e-6);
    EXPECT_TRUE(waitUntil([&] {
        return std::abs(editor->avPlayer->currentTime().seconds() - playhead()) < 1e-3;
    })) << "the player follows the playhead";

    type(Qt::Key_I);
    EXPECT_NEAR(editor->editStartTime, frame, 1e-6);
    type(Qt::Key_Right, Qt::ShiftModifier);
    type(Qt::Key_Home);
    EXPECT_NEAR(playhead(), frame, 1e-6) << "Home keeps inside the range";
    type(Qt::Key_O);
    EXPECT_NEAR(editor->editEndTime, frame + 1.0, 1e-6) << "the least length";

    type(Qt::Key_Escape);
    EXPECT_FALSE(editor->isTrimming());
    EXPECT_TRUE(topBarHolds(editor->doneButton)) << "an edit was made: done, not cancel";
    EXPECT_NEAR(editor->editEndTime, frame + 1.0, 1e-6);
    type(Qt::Key_Escape); // nothing left to cancel
    EXPECT_FALSE(editor->isTrimming());
}

TEST_F(EditorKeyboardTest, KeysWaitWhileASheetCoversTheEditor) {
    auto sheet = std::make_shared<ViewController>();
    editor->presentViewController_animated_completion(sheet, false);
    ASSERT_TRUE(waitUntil([&] { return editor->presentedViewController() != nullptr; }));
    type(Qt::Key_Space);
    type(Qt::Key_I);
    EXPECT_TRUE(editor->isIntroMode());
    EXPECT_FALSE(editor->isTrimming());

    editor->dismissViewControllerAnimated_completion(false);
    ASSERT_TRUE(waitUntil([&] { return editor->presentedViewController() == nullptr; }));
    type(Qt::Key_I);
    EXPECT_TRUE(editor->isTrimming());
}

TEST_F(EditorKeyboardTest, EachControlNamesItsKey) {
    type(Qt::Key_I); // edit mode: the bar with the most keyed items
    const auto button = [&](const std::shared_ptr<ToolbarItem>& item) {
        return editor->topToolBar->widgetForItem(item.get());
    };
    const QString ctrlS = QKeySequence(QKeySequence::Save).toString(QKeySequence::NativeText);
    EXPECT_EQ(button(editor->playButton)->toolTip(), editor->playButton->title() + " (Space)");
    EXPECT_EQ(button(editor->playButton)->accessibleDescription(), "Shortcut: Space");
    EXPECT_EQ(button(editor->trimButton)->toolTip(),
              editor->trimButton->title() + " (" + ctrlS + ")");
    EXPECT_EQ(button(editor->cancelTrimButton)->accessibleDescription(), "Shortcut: Esc");
    EXPECT_EQ(editor->saveButton->shortcut(), QKeySequence(QKeySequence::Save));
    EXPECT_EQ(editor->pauseButton->shortcut(), QKeySequence(Qt::Key_Space));
    EXPECT_TRUE(button(editor->titleButton)->toolTip().isEmpty());
    const QString scrubberKeys = editor->avTrimmer->accessibleDescription();
    EXPECT_TRUE(scrubberKeys.contains(" I ") && scrubberKeys.contains(" O "))
        << scrubberKeys.toStdString();
    EXPECT_EQ(editor->videoOverlayPlayButtonView->toolTip(), "Play (Space)");
}
