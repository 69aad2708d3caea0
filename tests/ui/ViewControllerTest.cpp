#include "platform/ui/ViewController.h"
#include "platform/ui/Alert.h"
#include "platform/ui/Animation.h"
#include "platform/ui/Screen.h"
#include "platform/ui/Window.h"
#include "support/LogCapture.h"
#include "support/Wait.h"
#include "ui/UiInput.h"

#include <QAction>
#include <QCoreApplication>
#include <QPushButton>
#include <gtest/gtest.h>

using namespace platform;
using testing_support::waitUntil;

namespace {

// Writes down every call it hears.
struct Recorder : ViewController {
    explicit Recorder(bool responds = false) : responds(responds) {}
    bool canBecomeFirstResponder() const override { return responds; }
    void viewWillAppear(bool) override { calls << "willAppear"; }
    void viewDidAppear(bool) override { calls << "didAppear"; }
    void viewWillDisappear(bool) override { calls << "willDisappear"; }
    void viewDidDisappear(bool) override { calls << "didDisappear"; }
    void motionEnded_withEvent(MotionEvent::Subtype motion, const MotionEvent& event) override {
        calls << QStringLiteral("motion %1").arg(int(motion));
        ViewController::motionEnded_withEvent(motion, event);
    }
    void viewWillTransitionToSize_withTransitionCoordinator(
        const QSizeF& size, TransitionCoordinator& coordinator) override {
        ViewController::viewWillTransitionToSize_withTransitionCoordinator(size, coordinator);
        calls << QStringLiteral("transition to %1 from %2").arg(size.width()).arg(view()->width());
        coordinator.animateAlongsideTransition_completion(
            [this](TransitionCoordinator&) {
                calls << QStringLiteral("alongside at %1").arg(view()->bounds().width());
                animatingAlongside = Animation::inAnimationBlock();
            },
            [this](TransitionCoordinator&) { calls << "completion"; });
    }
    bool responds;
    QStringList calls;
    bool animatingAlongside = false;
};

struct Shown {
    Shown() {
        window.resize(480, 360);
        window.setRootViewController(root);
        window.show();
        waitUntil([&] { return root->appearance() == ViewController::Appearance::Appeared; });
        QCoreApplication::processEvents();
    }
    // Presents `controller` from `from` (the root) and waits for it.
    void present(const std::shared_ptr<ViewController>& controller, bool animated = false,
                 ViewController* from = nullptr) {
        bool presented = false;
        (from ? from : root.get())
            ->presentViewController_animated_completion(controller, animated,
                                                        [&] { presented = true; });
        EXPECT_TRUE(waitUntil([&] { return presented; }));
    }
    Window window;
    std::shared_ptr<Recorder> root = std::make_shared<Recorder>();
};

} // namespace

TEST(UiViewController, AppearanceFollowsTheWindowAndAResizeIsASizeTransition) {
    Shown shown;
    EXPECT_EQ(shown.root->calls, (QStringList{"willAppear", "didAppear"}));
    EXPECT_EQ(Screen::mainScreen().bounds().size(), QSizeF(shown.window.contentArea()->size()));
    auto child = std::make_shared<Recorder>();
    shown.root->addChildViewController(child);
    shown.root->view()->addSubview(child->view());
    ASSERT_TRUE(waitUntil([&] { return child->calls.contains("didAppear"); }));

    shown.root->calls.clear();
    const int oldWidth = shown.root->view()->width();
    shown.window.resize(640, 360);
    ASSERT_TRUE(waitUntil([&] { return shown.root->calls.contains("completion"); }));
    const int newWidth = shown.window.contentArea()->width();
    EXPECT_EQ(shown.root->calls,
              (QStringList{QStringLiteral("transition to %1 from %2").arg(newWidth).arg(oldWidth),
                           QStringLiteral("alongside at %1").arg(newWidth), "completion"}));
    EXPECT_TRUE(shown.root->animatingAlongside) << "changes made alongside animate";

    shown.window.hide();
    EXPECT_EQ(shown.root->calls.mid(3), (QStringList{"willDisappear", "didDisappear"}));
    EXPECT_TRUE(child->calls.contains("didDisappear"));
}

TEST(UiViewController, ShakeReachesTheFirstResponderThenItsParentOrElseTheTopOfTheChain) {
    Shown shown;
    auto responder = std::make_shared<Recorder>(true);
    shown.root->addChildViewController(responder);
    EXPECT_FALSE(shown.root->becomeFirstResponder());
    ASSERT_TRUE(responder->becomeFirstResponder());
    EXPECT_EQ(shown.window.shakeAction()->shortcut(), QKeySequence(Qt::CTRL | Qt::Key_Z));
    shown.window.shakeAction()->trigger();
    EXPECT_EQ(responder->calls.last(), "motion 1");
    EXPECT_TRUE(shown.root->calls.contains("motion 1")) << "the base passes it on";

    responder->resignFirstResponder();
    EXPECT_EQ(ViewController::firstResponder(), nullptr);
    auto sheet = std::make_shared<Recorder>();
    shown.present(sheet);
    shown.window.shake();
    EXPECT_EQ(sheet->calls.last(), "motion 1");
}

TEST(UiViewController, PresentationsCoverThePresenterStackAndGoAsOneChain) {
    Shown shown;
    auto first = std::make_shared<Recorder>();
    auto second = std::make_shared<Recorder>();
    shown.root->calls.clear();
    shown.present(first, true);
    EXPECT_EQ(shown.root->presentedViewController(), first.get());
    EXPECT_EQ(first->presentingViewController(), shown.root.get());
    EXPECT_EQ(first->view()->size(), shown.window.contentArea()->size());
    EXPECT_TRUE(shown.root->calls.contains("didDisappear"));

    // Presenting from the root again goes on top of what it already shows,
    // and a controller is shown only once.
    shown.present(second);
    EXPECT_EQ(first->presentedViewController(), second.get());
    testing_support::LogCapture log;
    shown.root->presentViewController_animated_completion(second, false);
    EXPECT_EQ(log.lines().size(), 1);
    EXPECT_EQ(second->presentingViewController(), first.get());

    bool dismissed = false;
    shown.root->dismissViewControllerAnimated_completion(false, [&] { dismissed = true; });
    ASSERT_TRUE(waitUntil([&] { return dismissed; }));
    EXPECT_EQ(shown.root->presentedViewController(), nullptr);
    EXPECT_EQ(first->presentedViewController(), nullptr) << "the whole chain goes";
    EXPECT_EQ(first->view()->parentWidget(), nullptr);
    EXPECT_TRUE(shown.root->view()->isVisible());
    EXPECT_EQ(shown.root->calls.mid(shown.root->calls.lastIndexOf("didDisappear") + 1).first(),
              "willAppear");
}

TEST(UiViewController, AlertKeysPickTheDefaultOrTheCancelAction) {
    Shown shown;
    QStringList ran;
    for (int key : {Qt::Key_Return, Qt::Key_Escape}) {
        auto alert = Alert::make(QStringLiteral("Published"), QString());
        const auto note = [&](AlertAction& a) { ran << a.title(); };
        alert->addAction(AlertAction::make("Close", AlertAction::Style::Cancel, note));
        alert->addAction(AlertAction::make("View", AlertAction::Style::Default, note));
        alert->addAction(AlertAction::make("Second cancel", AlertAction::Style::Cancel));
        EXPECT_EQ(alert->actions().size(), 2);
        shown.present(alert);
        EXPECT_TRUE(shown.root->view()->isVisible()) << "an alert leaves the presenter beneath";

        ui_input::key(alert->buttonForAction(alert->actions().at(1).get()), key);
        ASSERT_TRUE(waitUntil([&] { return ran.size() == (key == Qt::Key_Return ? 1 : 2); }));
        EXPECT_EQ(shown.root->presentedViewController(), nullptr);
    }
    EXPECT_EQ(ran, (QStringList{"View", "Close"}));
}
