#include "platform/ui/Window.h"

#include "platform/ui/Screen.h"
#include "platform/ui/TransitionCoordinator.h"
#include "platform/ui/ViewController.h"

#include <QAction>
#include <QElapsedTimer>
#include <QMenuBar>
#include <QResizeEvent>
#include <QTimer>

namespace platform {

namespace {
double secondsSinceStart() {
    static QElapsedTimer clock = [] {
        QElapsedTimer t;
        t.start();
        return t;
    }();
    return double(clock.nsecsElapsed()) / 1e9;
}
} // namespace

Window::Window(QWidget* parent) : QMainWindow(parent), content_(new QWidget(this)) {
    content_->setObjectName(QStringLiteral("tamsel.windowContent"));
    setCentralWidget(content_);
    content_->installEventFilter(this);

    QMenu* edit = menuBar()->addMenu(tr("&Edit"));
    shake_ = edit->addAction(tr("Shake"));
    shake_->setShortcut(QKeySequence(Qt::CTRL | Qt::Key_Z));
    shake_->setShortcutContext(Qt::WindowShortcut);
    connect(shake_, &QAction::triggered, this, &Window::shake);

    Screen::setMainWindow(content_);
}

Window::~Window() {
    if (Screen::mainWindow() == content_)
        Screen::setMainWindow(nullptr);
    if (root_ && root_->isViewLoaded())
        View::removeFromSuperview(root_->view());
}

void Window::setRootViewController(std::shared_ptr<ViewController> controller) {
    if (root_ && root_->isViewLoaded())
        View::removeFromSuperview(root_->view());
    root_ = std::move(controller);
    lastSize_ = content_->size();
    if (!root_)
        return;
    View* view = root_->view();
    view->setParent(content_);
    view->setFrame(QRectF(QPointF(0, 0), QSizeF(content_->size())));
    view->show();
}

void Window::shake() {
    ViewController* target = ViewController::firstResponder();
    if (!target && root_) {
        target = root_.get();
        while (target->presentedViewController())
            target = target->presentedViewController();
    }
    if (!target)
        return;
    MotionEvent event;
    event.type = MotionEvent::Type::Motion;
    event.subtype = MotionEvent::Subtype::MotionShake;
    event.timestamp = secondsSinceStart();
    QPointer<ViewController> guard(target);
    target->motionBegan_withEvent(MotionEvent::Subtype::MotionShake, event);
    if (guard)
        target->motionEnded_withEvent(MotionEvent::Subtype::MotionShake, event);
}

bool Window::eventFilter(QObject* watched, QEvent* event) {
    if (watched == content_ && event->type() == QEvent::Resize)
        transitionTo(static_cast<QResizeEvent*>(event)->size());
    return QMainWindow::eventFilter(watched, event);
}

void Window::showEvent(QShowEvent* event) {
    QMainWindow::showEvent(event);
    QTimer::singleShot(0, this, [this] { settled_ = true; });
}

void Window::transitionTo(const QSize& size) {
    if (!root_ || size == lastSize_)
        return;
    View* view = root_->view();
    const bool firstLayout = !settled_ || !isVisible();
    lastSize_ = size;
    if (firstLayout) {
        view->setFrame(QRectF(QPointF(0, 0), QSizeF(size)));
        return;
    }
    auto coordinator = TransitionCoordinator::make(TransitionDuration);
    root_->viewWillTransitionToSize_withTransitionCoordinator(QSizeF(size), *coordinator);
    view->setFrame(QRectF(QPointF(0, 0), QSizeF(size)));
    view->layoutIfNeeded();
    coordinator->run();
}

} // namespace platform
