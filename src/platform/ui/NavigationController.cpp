#include "platform/ui/NavigationController.h"

#include "platform/runtime/Log.h"

#include <QVariant>

namespace platform {

namespace {
constexpr const char* kNavigationItem = "tamsel.navigationItem";
constexpr qreal kBarHeight = 44;
} // namespace

void NavigationItem::setTitle(const QString& title) {
    title_ = title;
    emit changed();
}

void NavigationItem::setLeftBarButtonItem(std::shared_ptr<ToolbarItem> item) {
    left_ = std::move(item);
    emit changed();
}

void NavigationItem::setRightBarButtonItem(std::shared_ptr<ToolbarItem> item) {
    right_ = std::move(item);
    emit changed();
}

std::shared_ptr<NavigationController>
NavigationController::initWithRootViewController(std::shared_ptr<ViewController> root) {
    auto controller = std::shared_ptr<NavigationController>(new NavigationController);
    if (root)
        controller->pushViewController_animated(std::move(root), false);
    return controller;
}

NavigationItem* NavigationController::navigationItemOf(ViewController* controller) {
    if (!controller)
        return nullptr;
    auto* item = controller->findChild<NavigationItem*>(QString::fromLatin1(kNavigationItem),
                                                        Qt::FindDirectChildrenOnly);
    if (!item) {
        item = new NavigationItem;
        item->setObjectName(QString::fromLatin1(kNavigationItem));
        item->setParent(controller);
    }
    return item;
}

NavigationController*
NavigationController::navigationControllerOf(const ViewController* controller) {
    for (auto* parent = controller ? controller->parentViewController() : nullptr; parent;
         parent = parent->parentViewController())
        if (auto* navigation = qobject_cast<NavigationController*>(parent))
            return navigation;
    return nullptr;
}

ViewController* NavigationController::topViewController() const {
    return stack_.isEmpty() ? nullptr : stack_.last().get();
}

void NavigationController::loadView() {
    auto* root = new View(QRectF(0, 0, 480, 640));
    root->setBackgroundColor(QColor(0xf2, 0xf2, 0xf7));
    bar_ = new Toolbar(QRectF(0, 0, root->bounds().width(), kBarHeight));
    bar_->setAutoresizingMask(View::FlexibleWidth);
    titleLabel_ = new Label(QRectF(0, 0, 240, kBarHeight));
    titleLabel_->setSystemFontOfSize(17);
    titleLabel_->setTextAlignment(Qt::AlignCenter);
    titleLabel_->setBackgroundColor(QColor());
    titleItem_ = ToolbarItem::customViewItem(titleLabel_);
    root->addSubview(bar_.get());
    setView(root);
    if (auto* top = topViewController())
        show(top);
}

Toolbar* NavigationController::navigationBar() {
    view();
    return bar_.get();
}

void NavigationController::pushViewController_animated(std::shared_ptr<ViewController> controller,
                                                       bool animated) {
    if (!controller || controller->parentViewController()) {
        logError(
            QStringLiteral("NavigationController: refused a controller that already has a parent"));
        return;
    }
    ViewController* previous = topViewController();
    addChildViewController(controller);
    stack_.append(controller);
    if (isViewLoaded()) {
        if (previous && previous->isViewLoaded())
            previous->view()->hide();
        show(controller.get());
    }
    controller->didMoveToParentViewController(this);
}

std::shared_ptr<ViewController> NavigationController::popViewControllerAnimated(bool animated) {
    if (stack_.size() < 2)
        return nullptr;
    std::shared_ptr<ViewController> top = stack_.takeLast();
    top->willMoveToParentViewController(nullptr);
    if (top->isViewLoaded())
        View::removeFromSuperview(top->view());
    top->removeFromParentViewController();
    if (isViewLoaded())
        show(topViewController());
    return top;
}

void NavigationController::show(ViewController* controller) {
    View* content = controller->view();
    View* root = view();
    if (content->parentWidget() != root)
        root->insertSubviewBelow(content, bar_.get());
    content->show();
    viewDidLayoutSubviews();
    disconnect(itemConnection_);
    itemConnection_ = connect(navigationItemOf(controller), &NavigationItem::changed, this,
                              &NavigationController::refreshBar);
    refreshBar();
}

void NavigationController::refreshBar() {
    NavigationItem* item = navigationItemOf(topViewController());
    if (!item || !bar_)
        return;
    titleLabel_->setText(item->title());
    Toolbar::ItemList items;
    items << (item->leftBarButtonItem() ? item->leftBarButtonItem() : ToolbarItem::fixedSpace(0));
    items << ToolbarItem::flexibleSpace() << titleItem_ << ToolbarItem::flexibleSpace();
    items << (item->rightBarButtonItem() ? item->rightBarButtonItem() : ToolbarItem::fixedSpace(0));
    bar_->setItems(items);
}

void NavigationController::viewDidLayoutSubviews() {
    ViewController::viewDidLayoutSubviews();
    View* root = view();
    const QRectF bounds = root->bounds();
    bar_->setFrame(QRectF(0, 0, bounds.width(), kBarHeight));
    if (auto* top = topViewController(); top && top->isViewLoaded())
        top->view()->setFrame(QRectF(0, kBarHeight, bounds.width(),
                                     std::max<qreal>(0, bounds.height() - kBarHeight)));
}

} // namespace platform
