#include "platform/ui/ViewController.h"
#include "platform/ui/Alert.h"
#include "platform/ui/Animation.h"
#include "platform/ui/PresentationContainer.h"
#include "platform/ui/Screen.h"
#include "platform/ui/Toolbar.h"
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
class Recorder : public ViewController {
    Q_OBJECT
  public:
    explicit Recorder(QString name, bool responds = false)
        : name_(std::move(name)), responds_(responds) {}
    QStringList calls;

    bool canBecomeFirstResponder() const override { return responds_; }
    void willMoveToParentViewController(ViewController* parent) override {
        calls << QStringLiteral("willMove %1").arg(nameOf(parent));
    }
    void didMoveToParentViewController(ViewController* parent) override {
        calls << QStringLiteral("didMove %1").arg(nameOf(parent));
    }
    void viewWillAppear(bool) override { calls << QStringLiteral("willAppear"); }
    void viewDidAppear(bool) override { calls << QStringLiteral("didAppear"); }
    void viewWillDisappear(bool) override { calls << QStringLiteral("willDisappear"); }
    void viewDidDisappear(bool) override { calls << QStringLiteral("didDisappear"); }
    void motionEnded_withEvent(MotionEvent::Subtype motion, const MotionEvent& event) override {
        calls << QStringLiteral("motion %1").arg(int(motion));
        ViewController::motionEnded_withEvent(motion, event);
    }
    void viewWillTransitionToSize_withTransitionCoordinator(
        const QSizeF& size, TransitionCoordinator& coordinator) override {
        ViewController::viewWillTransitionToSize_withTransitionCoordinator(size, coordinator);
        calls << QStringLiteral("transition to %1x%2 from %3")
                     .arg(size.width())
                     .arg(size.height())
                     .arg(view()->width());
        coordinator.animateAlongsideTransition_completion(
            [this](TransitionCoordinator&) {
                calls << QStringLiteral("alongside at %1").arg(view()->bounds().width());
                animatingAlongside = Animation::inAnimationBlock();
            },
            [this](TransitionCoordinator&) { calls << QStringLiteral("completion"); });
    }
    bool animatingAlongside = false;

  private:
    static QString nameOf(ViewController* controller) {
        auto* recorder = qobject_cast<Recorder*>(controller);
        return recorder ? recorder->name_ : QStringLiteral("none");
    }
    QString name_;
    bool responds_;
};

struct Shown {
    explicit Shown(std::shared_ptr<Recorder> controller) : root(std::move(controller)) {
        window.resize(480, 360);
        window.setRootViewController(root);
        window.show();
        waitUntil([&] { return root->appearance() == ViewController::Appearance::Appeared; });
        QCoreApplication::processEvents();
    }
    Window window;
    std::shared_ptr<Recorder> root;
};

} // namespace

TEST(UiViewController, ContainmentTellsTheChildAndKeepsItAlive) {
    auto parent = std::make_shared<Recorder>(QStringLiteral("parent"));
    std::weak_ptr<Recorder> weakChild;
    {
        auto child = std::make_shared<Recorder>(QStringLiteral("child"));
        weakChild = child;
        parent->addChildViewController(child);
        parent->view()->addSubview(child->view());
        child->didMoveToParentViewController(parent.get());
    }
    auto child = weakChild.lock();
    ASSERT_TRUE(child) << "the parent holds its child";
    EXPECT_EQ(child->parentViewController(), parent.get());
    EXPECT_EQ(parent->childViewControllers().size(), 1);

    child->willMoveToParentViewController(nullptr);
    child->view()->removeFromSuperview();
    child->removeFromParentViewController();
    EXPECT_EQ(child->calls,
              (QStringList{"willMove parent", "didMove parent", "willMove none", "didMove none"}));
    EXPECT_TRUE(parent->childViewControllers().isEmpty());
    EXPECT_EQ(child->parentViewController(), nullptr);
}

TEST(UiViewController, AppearanceFollowsTheViewInAShownWindow) {
    Shown shown(std::make_shared<Recorder>(QStringLiteral("root")));
    EXPECT_EQ(shown.root->calls, (QStringList{"willAppear", "didAppear"}));
    EXPECT_EQ(Screen::mainScreen().bounds().size(), QSizeF(shown.window.contentArea()->size()));

    auto child = std::make_shared<Recorder>(QStringLiteral("child"));
    shown.root->addChildViewController(child);
    shown.root->view()->addSubview(child->view());
    ASSERT_TRUE(waitUntil([&] { return child->calls.contains("didAppear"); }));

    shown.window.hide();
    EXPECT_EQ(shown.root->calls.mid(2), (QStringList{"willDisappear", "didDisappear"}));
    EXPECT_TRUE(child->calls.contains("didDisappear"));
}

TEST(UiViewController, AWindowResizeIsASizeTransition) {
    Shown shown(std::make_shared<Recorder>(QStringLiteral("root")));
    shown.root->calls.clear();
    const int oldWidth = shown.root->view()->width();

    shown.window.resize(640, 360);
    ASSERT_TRUE(waitUntil([&] { return shown.root->calls.contains("completion"); }));
    const int newWidth = shown.window.contentArea()->width();
    EXPECT_EQ(shown.root->calls,
              (QStringList{QStringLiteral("transition to %1x%2 from %3")
                               .arg(newWidth)
                               .arg(shown.window.contentArea()->height())
                               .arg(oldWidth),
                           QStringLiteral("alongside at %1").arg(newWidth), "completion"}));
    EXPECT_TRUE(shown.root->animatingAlongside) << "changes made alongside animate";
}

TEST(UiViewController, ShakeReachesTheFirstResponderThenItsParent) {
    Shown shown(std::make_shared<Recorder>(QStringLiteral("root")));
    auto responder = std::make_shared<Recorder>(QStringLiteral("editor"), true);
    shown.root->addChildViewController(responder);
    EXPECT_FALSE(shown.root->becomeFirstResponder());
    ASSERT_TRUE(responder->becomeFirstResponder());

    EXPECT_EQ(shown.window.shakeAction()->shortcut(), QKeySequence(Qt::CTRL | Qt::Key_Z));
    shown.window.shakeAction()->trigger();
    EXPECT_EQ(responder->calls.last(), "motion 1");
    EXPECT_TRUE(shown.root->calls.contains("motion 1")) << "the base passes it on";

    responder->resignFirstResponder();
    EXPECT_EQ(ViewController::firstResponder(), nullptr);
}

TEST(UiViewController, PresentingFullScreenCoversThePresenterUntilDismissed) {
    Shown shown(std::make_shared<Recorder>(QStringLiteral("root")));
    auto sheet = std::make_shared<Recorder>(QStringLiteral("sheet"));
    bool presented = false;
    shown.root->calls.clear();
    shown.root->presentViewController_animated_completion(sheet, true, [&] { presented = true; });
    EXPECT_FALSE(presented);
    ASSERT_TRUE(waitUntil([&] { return presented; }));
    EXPECT_EQ(shown.root->presentedViewController(), sheet.get());
    EXPECT_EQ(sheet->presentingViewController(), shown.root.get());
    EXPECT_EQ(sheet->view()->size(), shown.window.contentArea()->size());
    EXPECT_TRUE(shown.root->calls.contains("didDisappear"));

    bool dismissed = false;
    sheet->dismissViewControllerAnimated_completion(false, [&] { dismissed = true; });
    ASSERT_TRUE(waitUntil([&] { return dismissed; }));
    EXPECT_EQ(shown.root->presentedViewController(), nullptr);
    EXPECT_EQ(sheet->view()->parentWidget(), nullptr);
    EXPECT_TRUE(shown.root->view()->isVisible());
    EXPECT_EQ(shown.root->calls.mid(shown.root->calls.lastIndexOf("didDisappear") + 1).first(),
              "willAppear");
}

TEST(UiViewController, APopoverPointsAtItsToolbarItemAndAPressOutsideClosesIt) {
    Shown shown(std::make_shared<Recorder>(QStringLiteral("root")));
    auto* bar = new Toolbar(QRectF(0, 0, 480, 44));
    shown.root->view()->addSubview(bar);
    auto share = ToolbarItem::systemItem(ToolbarItem::SystemItem::Action);
    bar->setItems({ToolbarItem::flexibleSpace(), share});

    auto sheet = std::make_shared<Recorder>(QStringLiteral("sheet"));
    sheet->setModalPresentationStyle(ViewController::ModalPresentationStyle::Popover);
    sheet->setPreferredContentSize(QSizeF(200, 100));
    sheet->setPopoverItem(share);
    bool presented = false;
    shown.root->presentViewController_animated_completion(sheet, false, [&] { presented = true; });
    ASSERT_TRUE(waitUntil([&] { return presented; }));

    const QRect anchor(
        bar->widgetForItem(share.get())->mapTo(shown.window.contentArea(), QPoint(0, 0)),
        bar->widgetForItem(share.get())->size());
    const QRect panel(sheet->view()->mapTo(shown.window.contentArea(), QPoint(0, 0)),
                      sheet->view()->size());
    EXPECT_EQ(panel.size(), QSize(200, 100));
    EXPECT_GT(panel.top(), anchor.bottom());
    EXPECT_TRUE(panel.left() <= anchor.center().x() && anchor.center().x() <= panel.right() + 1);
    EXPECT_TRUE(shown.root->view()->isVisible()) << "a popover leaves the presenter on screen";

    QWidget* container = sheet->view()->parentWidget();
    ui_input::press(container, QPointF(5, 300));
    ASSERT_TRUE(waitUntil([&] { return shown.root->presentedViewController() == nullptr; }));
}

TEST(UiViewController, AlertKeysPickTheDefaultOrTheCancelAction) {
    Shown shown(std::make_shared<Recorder>(QStringLiteral("root")));
    QStringList ran;
    for (int key : {Qt::Key_Return, Qt::Key_Escape}) {
        auto alert = Alert::make(QStringLiteral("Published"), QString());
        alert->addAction(AlertAction::make("Close", AlertAction::Style::Cancel,
                                           [&](AlertAction& a) { ran << a.title(); }));
        alert->addAction(AlertAction::make("View", AlertAction::Style::Default,
                                           [&](AlertAction& a) { ran << a.title(); }));
        alert->addAction(AlertAction::make("Second cancel", AlertAction::Style::Cancel));
        EXPECT_EQ(alert->actions().size(), 2);
        bool presented = false;
        shown.root->presentViewController_animated_completion(alert, false,
                                                              [&] { presented = true; });
        ASSERT_TRUE(waitUntil([&] { return presented; }));
        EXPECT_TRUE(shown.root->view()->isVisible()) << "an alert leaves the presenter beneath";

        QPushButton* view = alert->buttonForAction(alert->actions().at(1).get());
        ASSERT_TRUE(view);
        ui_input::key(view, key);
        ASSERT_TRUE(waitUntil([&] { return ran.size() == (key == Qt::Key_Return ? 1 : 2); }));
        EXPECT_EQ(shown.root->presentedViewController(), nullptr);
    }
    EXPECT_EQ(ran, (QStringList{"View", "Close"}));
}

TEST(UiViewController, PresentationsStackAndAControllerIsShownOnlyOnce) {
    Shown shown(std::make_shared<Recorder>(QStringLiteral("root")));
    auto first = std::make_shared<Recorder>(QStringLiteral("first"));
    auto second = std::make_shared<Recorder>(QStringLiteral("second"));
    shown.root->presentViewController_animated_completion(first, false);
    // Presenting from the root again goes on top of what it already shows.
    shown.root->presentViewController_animated_completion(second, false);
    EXPECT_EQ(first->presentedViewController(), second.get());

    testing_support::LogCapture log;
    shown.root->presentViewController_animated_completion(second, false);
    EXPECT_EQ(log.lines().size(), 1);
    EXPECT_EQ(second->presentingViewController(), first.get());

    // With no first responder a shake goes to the top of the chain.
    if (ViewController* current = ViewController::firstResponder())
        current->resignFirstResponder();
    shown.window.shake();
    EXPECT_EQ(second->calls.last(), "motion 1");

    bool dismissed = false;
    shown.root->dismissViewControllerAnimated_completion(false, [&] { dismissed = true; });
    ASSERT_TRUE(waitUntil([&] { return dismissed; }));
    EXPECT_EQ(shown.root->presentedViewController(), nullptr);
    EXPECT_EQ(first->presentedViewController(), nullptr) << "the whole chain goes";
}

#include "ViewControllerTest.moc"
