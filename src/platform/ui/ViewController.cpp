#include "platform/ui/ViewController.h"

#include "platform/runtime/Log.h"
#include "platform/ui/PresentationContainer.h"

#include <QEvent>
#include <QTimer>
#include <QVariant>

namespace platform {

namespace {
constexpr const char* kController = "tamsel.viewController";

QPointer<ViewController>& firstResponderSlot() {
    static QPointer<ViewController> current;
    return current;
}
} // namespace

ViewController::ViewController() = default;

ViewController::~ViewController() {
    if (container_) {
        if (view_)
            View::removeFromSuperview(view_.get());
        delete container_.data();
    }
    if (view_)
        view_->setProperty(kController, QVariant());
}

View* ViewController::view() {
    if (!view_ && !loading_) {
        loading_ = true;
        loadView();
        if (!view_)
            setView(new View());
        loading_ = false;
        viewDidLoad();
    }
    return view_.get();
}

void ViewController::loadView() {
    setView(new View());
}

void ViewController::setView(View* view) {
    if (view_.get() == view)
        return;
    if (view_) {
        view_->removeEventFilter(this);
        view_->setProperty(kController, QVariant());
        disconnect(view_.get(), nullptr, this, nullptr);
    }
    view_ = ViewHandle<View>(view);
    if (!view)
        return;
    view->setProperty(kController, QVariant::fromValue<QObject*>(this));
    view->installEventFilter(this);
    connect(view, &View::willLayoutSubviews, this, [this] { viewWillLayoutSubviews(); });
    connect(view, &View::didLayoutSubviews, this, [this] { viewDidLayoutSubviews(); });
}

ViewController* ViewController::controllerOfView(const QWidget* view) {
    if (!view)
        return nullptr;
    return qobject_cast<ViewController*>(view->property(kController).value<QObject*>());
}

void ViewController::viewDidLoad() {}
void ViewController::viewWillLayoutSubviews() {}
void ViewController::viewDidLayoutSubviews() {}
void ViewController::viewWillAppear(bool) {}
void ViewController::viewDidAppear(bool) {}
void ViewController::viewWillDisappear(bool) {}
void ViewController::viewDidDisappear(bool) {}
void ViewController::willMoveToParentViewController(ViewController*) {}
void ViewController::didMoveToParentViewController(ViewController*) {}

void ViewController::addChildViewController(const std::shared_ptr<ViewController>& child) {
    if (!child || child.get() == this || child->parent_ == this)
        return;
    if (child->parent_)
        child->removeFromParentViewController();
    child->willMoveToParentViewController(this);
    children_.append(child);
    child->parent_ = this;
}

void ViewController::removeFromParentViewController() {
    ViewController* parent = parent_;
    if (!parent)
        return;
    // The parent's list may hold the last reference.
    std::shared_ptr<ViewController> keep = shared_from_this();
    parent->children_.removeIf([this](const auto& c) { return c.get() == this; });
    parent_ = nullptr;
    didMoveToParentViewController(nullptr);
}

void ViewController::viewWillTransitionToSize_withTransitionCoordinator(
    const QSizeF& size, TransitionCoordinator& coordinator) {
    const auto children = children_;
    for (const auto& child : children)
        child->viewWillTransitionToSize_withTransitionCoordinator(size, coordinator);
    if (presented_)
        presented_->viewWillTransitionToSize_withTransitionCoordinator(size, coordinator);
}

bool ViewController::eventFilter(QObject* watched, QEvent* event) {
    if (view_.holds(watched) && !event->spontaneous()) {
        if (event->type() == QEvent::Show)
            beginAppearance(true);
        else if (event->type() == QEvent::Hide)
            beginAppearance(false);
    }
    return QObject::eventFilter(watched, event);
}

void ViewController::beginAppearance(bool appearing) {
    if (appearing) {
        if (appearance_ == Appearance::Appearing || appearance_ == Appearance::Appeared)
            return;
        appearance_ = Appearance::Appearing;
        viewWillAppear(false);
        // "Did appear" once the view has been through a turn of the loop,
        // which is when Qt has painted it.
        QTimer::singleShot(0, this, [this] {
            if (appearance_ != Appearance::Appearing)
                return;
            appearance_ = Appearance::Appeared;
            viewDidAppear(false);
        });
    } else {
        if (appearance_ == Appearance::Disappeared || appearance_ == Appearance::Disappearing)
            return;
        appearance_ = Appearance::Disappearing;
        viewWillDisappear(false);
        // Qt has hidden the view by the time it says so.
        appearance_ = Appearance::Disappeared;
        viewDidDisappear(false);
    }
}

bool ViewController::becomeFirstResponder() {
    if (!canBecomeFirstResponder())
        return false;
    ViewController* current = firstResponderSlot();
    if (current == this)
        return true;
    if (current)
        current->resignFirstResponder();
    firstResponderSlot() = this;
    return true;
}

bool ViewController::resignFirstResponder() {
    if (firstResponderSlot() == this)
        firstResponderSlot() = nullptr;
    return true;
}

bool ViewController::isFirstResponder() const {
    return firstResponderSlot() == this;
}

ViewController* ViewController::firstResponder() {
    return firstResponderSlot();
}

ViewController* ViewController::nextResponder() const {
    if (parent_)
        return parent_;
    return presenting_;
}

void ViewController::motionBegan_withEvent(MotionEvent::Subtype motion, const MotionEvent& event) {
    if (ViewController* next = nextResponder())
        next->motionBegan_withEvent(motion, event);
}

void ViewController::motionEnded_withEvent(MotionEvent::Subtype motion, const MotionEvent& event) {
    if (ViewController* next = nextResponder())
        next->motionEnded_withEvent(motion, event);
}

void ViewController::motionCancelled_withEvent(MotionEvent::Subtype motion,
                                               const MotionEvent& event) {
    if (ViewController* next = nextResponder())
        next->motionCancelled_withEvent(motion, event);
}

} // namespace platform
