#pragma once

#include "platform/ui/Label.h"
#include "platform/ui/Toolbar.h"
#include "platform/ui/ToolbarItem.h"
#include "platform/ui/ViewController.h"
#include "platform/ui/ViewHandle.h"

#include <QList>
#include <QString>
#include <memory>

namespace platform {

// What a controller shows in the navigation bar while it is on top of a
// navigation stack: a title, and an item at each end (Cancel and Publish,
// say). Changes show at once.
class NavigationItem : public QObject {
    Q_OBJECT
  public:
    QString title() const { return title_; }
    void setTitle(const QString& title);
    std::shared_ptr<ToolbarItem> leftBarButtonItem() const { return left_; }
    void setLeftBarButtonItem(std::shared_ptr<ToolbarItem> item);
    std::shared_ptr<ToolbarItem> rightBarButtonItem() const { return right_; }
    void setRightBarButtonItem(std::shared_ptr<ToolbarItem> item);

  signals:
    void changed();

  private:
    QString title_;
    std::shared_ptr<ToolbarItem> left_;
    std::shared_ptr<ToolbarItem> right_;
};

// A stack of controllers under a navigation bar: the top one fills the area
// beneath the bar, and the bar shows its navigation item. The root stays at
// the bottom; pushing puts a controller on top, popping takes it off (never
// the root).
//
// Main thread only. The navigation controller holds the controllers of its
// stack (as children); a controller finds its navigation controller through
// navigationControllerOf.
class NavigationController : public ViewController {
    Q_OBJECT
  public:
    static std::shared_ptr<NavigationController>
    initWithRootViewController(std::shared_ptr<ViewController> root);

    QList<std::shared_ptr<ViewController>> viewControllers() const { return stack_; }
    ViewController* topViewController() const;
    void pushViewController_animated(std::shared_ptr<ViewController> controller, bool animated);
    // The controller taken off, or null when only the root is left.
    std::shared_ptr<ViewController> popViewControllerAnimated(bool animated);

    Toolbar* navigationBar();
    // The navigation item of a controller (made on first request; it lives as
    // long as the controller).
    static NavigationItem* navigationItemOf(ViewController* controller);
    // The navigation controller whose stack holds `controller`, or null.
    static NavigationController* navigationControllerOf(const ViewController* controller);

  protected:
    NavigationController() = default;
    void loadView() override;
    void viewDidLayoutSubviews() override;

  private:
    void show(ViewController* controller);
    void refreshBar();

    QList<std::shared_ptr<ViewController>> stack_;
    ViewHandle<Toolbar> bar_;
    Label* titleLabel_ = nullptr; // owned by the bar's title item
    std::shared_ptr<ToolbarItem> titleItem_;
    QMetaObject::Connection itemConnection_;
};

} // namespace platform
