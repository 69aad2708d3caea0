#include "platform/ui/ViewController.h"

#include "platform/runtime/Log.h"
#include "platform/ui/Animation.h"
#include "platform/ui/PresentationContainer.h"
#include "platform/ui/ViewAlpha.h"

#include <QCoreApplication>
#include <QTimer>

namespace platform {

namespace {
constexpr double kPresentationDuration = 0.25;

void later(QObject* context, std::function<void()> job) {
    if (job)
        QTimer::singleShot(0, context, std::move(job));
}
} // namespace

ViewController* ViewController::topOfPresentationChain() {
    ViewController* top = this;
    while (top->presented_)
        top = top->presented_.get();
    return top;
}

void ViewController::presentViewController_animated_completion(
    const std::shared_ptr<ViewController>& controller, bool animated,
    std::function<void()> completion) {
    if (!controller)
        return;
    if (controller->presenting_ || controller->parent_ || controller.get() == this) {
        logError(QStringLiteral("Cannot present %1: it is already shown elsewhere")
                     .arg(QString::fromLatin1(controller->metaObject()->className())));
        return;
    }
    ViewController* top = topOfPresentationChain();
    if (top != this) {
        top->presentViewController_animated_completion(controller, animated, std::move(completion));
        return;
    }
    QWidget* host = PresentationContainer::hostFor(view());
    if (!host) {
        logError(QStringLiteral("Cannot present %1: the presenting view is not in a window")
                     .arg(QString::fromLatin1(controller->metaObject()->className())));
        return;
    }

    presented_ = controller;
    controller->presenting_ = this;
    auto* container = new PresentationContainer(host, controller.get());
    controller->container_ = container;
    container->addSubview(controller->view());
    container->show();
    container->raise();
    container->setNeedsLayout();
    container->layoutIfNeeded();

    QPointer<ViewController> self(this);
    auto finished = [self, completion = std::move(completion)]() mutable {
        if (self)
            self->finishPresentation(std::move(completion));
    };
    if (animated) {
        ViewAlpha::setPresentationAlpha(container, 0.0);
        Animation::animateWithDuration(
            kPresentationDuration, [container] { ViewAlpha::setAlpha(container, 1.0); },
            [finished = std::move(finished)](bool) mutable { finished(); });
    } else {
        later(this, std::move(finished));
    }
}

void ViewController::finishPresentation(std::function<void()> completion) {
    // A full-screen presentation takes the presenter's place, so the
    // presenter's view disappears (unless it is the window itself).
    if (presented_ && presented_->style_ == ModalPresentationStyle::FullScreen && view_ &&
        presented_->container_ && presented_->container_->parentWidget() != view_.get())
        view_->hide();
    if (completion)
        completion();
}

void ViewController::dismissViewControllerAnimated_completion(bool animated,
                                                              std::function<void()> completion) {
    if (!presented_) {
        if (presenting_)
            presenting_->dismissViewControllerAnimated_completion(animated, std::move(completion));
        return;
    }
    std::shared_ptr<ViewController> victim = presented_;
    if (victim->presented_)
        victim->dismissViewControllerAnimated_completion(false);

    presented_.reset();
    victim->presenting_ = nullptr;
    if (view_ && victim->style_ == ModalPresentationStyle::FullScreen && !view_->isVisible() &&
        view_->parentWidget())
        view_->show();

    QPointer<PresentationContainer> container = victim->container_;
    victim->container_ = nullptr;
    // The presented view goes back to its controller before its container
    // goes, so the controller can be presented again.
    auto remove = [victim, container, completion = std::move(completion)]() {
        if (victim->isViewLoaded())
            View::removeFromSuperview(victim->view());
        if (container)
            container->deleteLater();
        if (completion)
            completion();
    };
    if (animated && container) {
        Animation::animateWithDuration(
            kPresentationDuration, [container] { ViewAlpha::setAlpha(container, 0.0); },
            [remove = std::move(remove)](bool) { remove(); });
    } else {
        later(QCoreApplication::instance(), std::move(remove));
    }
}

} // namespace platform
