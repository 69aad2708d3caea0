#pragma once

#include "platform/ui/MotionEvent.h"

#include <QMainWindow>
#include <memory>

class QAction;

namespace platform {

class ViewController;

// A top-level window that shows a root view controller. Its content area is
// the main screen of what it shows (Screen::setMainWindow). A resize of the
// content area is a size transition: the controller hears
// viewWillTransitionToSize_withTransitionCoordinator with its view at the old
// size, the view takes the new size, then the coordinator's alongside blocks
// run in one animation and its completions after it.
//
// The Edit menu's Shake entry (Ctrl+Z) delivers the shake motion to the first
// responder, or to the top of the presentation chain when no controller is
// first responder. Main thread only.
class Window : public QMainWindow {
    Q_OBJECT
  public:
    explicit Window(QWidget* parent = nullptr);
    ~Window() override;

    void setRootViewController(std::shared_ptr<ViewController> controller);
    std::shared_ptr<ViewController> rootViewController() const { return root_; }
    // The area the root view fills.
    QWidget* contentArea() const { return content_; }
    QAction* shakeAction() const { return shake_; }

    // Seconds a transition animates.
    static constexpr double TransitionDuration = 0.3;

  public slots:
    void shake();

  protected:
    bool eventFilter(QObject* watched, QEvent* event) override;
    void showEvent(QShowEvent* event) override;

  private:
    void transitionTo(const QSize& size);

    std::shared_ptr<ViewController> root_;
    QWidget* content_;
    QAction* shake_;
    QSize lastSize_;
    // Sizes the window takes while it first comes up are not transitions.
    bool settled_ = false;
};

} // namespace platform
