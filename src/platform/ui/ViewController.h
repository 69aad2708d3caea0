#pragma once

#include "platform/ui/MotionEvent.h"
#include "platform/ui/TransitionCoordinator.h"
#include "platform/ui/View.h"
#include "platform/ui/ViewHandle.h"

#include <QObject>
#include <QPointer>
#include <QSizeF>
#include <functional>
#include <memory>

namespace platform {

class ToolbarItem;
class PresentationContainer;

// A view controller: owns a root view (made on first request by loadView),
// contains child controllers, hears when its view appears and disappears and
// when the window changes size, presents other controllers modally, and can
// be the first responder that receives motion events (the shake). Controllers
// are held by std::shared_ptr: a parent holds its children, a presenter what
// it presents; the other direction is weak. Main thread only.
class ViewController : public QObject, public std::enable_shared_from_this<ViewController> {
    Q_OBJECT
  public:
    enum class ModalPresentationStyle {
        FullScreen = 0,     // covers the window; the presenter's view disappears
        OverFullScreen = 5, // covers the window; the presenter stays beneath (alerts)
        Popover = 7,        // a panel pointing at a toolbar item
    };
    enum class Appearance { Disappeared, Appearing, Appeared, Disappearing };

    ViewController();
    ~ViewController() override;

    // The root view, loaded on first use (loadView, then viewDidLoad).
    View* view();
    bool isViewLoaded() const { return bool(view_); }
    void setView(View* view);

    // Containment. addChildViewController calls willMoveToParentViewController
    // with the parent; the caller adds the child's view and then calls
    // didMoveToParentViewController. Before removing, the caller calls
    // willMoveToParentViewController with null; removeFromParentViewController
    // calls didMoveToParentViewController with null.
    void addChildViewController(const std::shared_ptr<ViewController>& child);
    void removeFromParentViewController();
    virtual void willMoveToParentViewController(ViewController* parent);
    virtual void didMoveToParentViewController(ViewController* parent);
    QList<std::shared_ptr<ViewController>> childViewControllers() const { return children_; }
    ViewController* parentViewController() const { return parent_; }

    // Appearance: the root view becoming visible in a shown window, or
    // leaving it. Each pair is called once per change.
    virtual void viewWillAppear(bool animated);
    virtual void viewDidAppear(bool animated);
    virtual void viewWillDisappear(bool animated);
    virtual void viewDidDisappear(bool animated);
    Appearance appearance() const { return appearance_; }

    virtual void viewDidLoad();
    virtual void viewWillLayoutSubviews();
    virtual void viewDidLayoutSubviews();

    // A size change of the window that shows this controller. Called with
    // the root view still at its old size; the base passes it on to the
    // children.
    virtual void
    viewWillTransitionToSize_withTransitionCoordinator(const QSizeF& size,
                                                       TransitionCoordinator& coordinator);

    // Modal presentation in this controller's window.
    ModalPresentationStyle modalPresentationStyle() const { return style_; }
    void setModalPresentationStyle(ModalPresentationStyle style) { style_ = style; }
    // Where a popover points (held weakly); without one it stands centred.
    void setPopoverItem(const std::shared_ptr<ToolbarItem>& item) { popoverItem_ = item; }
    std::shared_ptr<ToolbarItem> popoverItem() const { return popoverItem_.lock(); }
    QSizeF preferredContentSize() const { return preferredSize_; }
    void setPreferredContentSize(const QSizeF& size) { preferredSize_ = size; }

    // Presents `controller` over this one (or over what this one already
    // presents: a new presentation goes on top of the chain). The completion
    // runs when it is on screen, on a later turn of the event loop. A
    // controller that is already presented somewhere is refused and logged.
    void
    presentViewController_animated_completion(const std::shared_ptr<ViewController>& controller,
                                              bool animated, std::function<void()> completion = {});
    // Dismisses what this controller presents, or, on a presented controller,
    // itself.
    void dismissViewControllerAnimated_completion(bool animated,
                                                  std::function<void()> completion = {});
    ViewController* presentedViewController() const { return presented_.get(); }
    ViewController* presentingViewController() const { return presenting_; }

    // Responder. Only one controller is first responder at a time.
    virtual bool canBecomeFirstResponder() const { return false; }
    bool becomeFirstResponder();
    bool resignFirstResponder();
    bool isFirstResponder() const;
    static ViewController* firstResponder();
    // Motion events go to the first responder; the base passes them to the
    // next responder (the parent, else the presenter).
    virtual void motionBegan_withEvent(MotionEvent::Subtype motion, const MotionEvent& event);
    virtual void motionEnded_withEvent(MotionEvent::Subtype motion, const MotionEvent& event);
    virtual void motionCancelled_withEvent(MotionEvent::Subtype motion, const MotionEvent& event);
    ViewController* nextResponder() const;

    // The controller whose root view is `view` (or null).
    static ViewController* controllerOfView(const QWidget* view);

  protected:
    // Makes the root view; the default makes a plain View.
    virtual void loadView();
    bool eventFilter(QObject* watched, QEvent* event) override;

  private:
    friend class PresentationContainer;
    void beginAppearance(bool appearing);
    void finishPresentation(std::function<void()> completion);
    ViewController* topOfPresentationChain();

    ViewHandle<View> view_;
    bool loading_ = false;
    QList<std::shared_ptr<ViewController>> children_;
    QPointer<ViewController> parent_;
    Appearance appearance_ = Appearance::Disappeared;

    ModalPresentationStyle style_ = ModalPresentationStyle::FullScreen;
    std::weak_ptr<ToolbarItem> popoverItem_;
    QSizeF preferredSize_{320, 400};
    std::shared_ptr<ViewController> presented_;
    QPointer<ViewController> presenting_;
    QPointer<PresentationContainer> container_;
};

} // namespace platform
