#include "platform/ui/PresentationContainer.h"

#include "platform/ui/Toolbar.h"
#include "platform/ui/ToolbarItem.h"
#include "platform/ui/ViewController.h"

#include <QMouseEvent>
#include <QPainter>
#include <QPainterPath>

namespace platform {

namespace {
constexpr qreal kPopoverGap = 8.0;
constexpr qreal kEdge = 8.0;
} // namespace

QWidget* PresentationContainer::hostFor(QWidget* view) {
    if (!view)
        return nullptr;
    QWidget* top = view->window();
    // The content area of a main window; a bare top-level view is its own.
    if (auto* central = top->findChild<QWidget*>(QStringLiteral("tamsel.windowContent"),
                                                 Qt::FindDirectChildrenOnly))
        return central;
    return top;
}

PresentationContainer::PresentationContainer(QWidget* host, ViewController* presented)
    : View(QRectF(QPointF(0, 0), QSizeF(host->size())), host), host_(host), presented_(presented) {
    host->installEventFilter(this);
    setAccessibleName(tr("Presentation"));
}

bool PresentationContainer::isPopover() const {
    return presented_ &&
           presented_->modalPresentationStyle() == ViewController::ModalPresentationStyle::Popover;
}

bool PresentationContainer::eventFilter(QObject* watched, QEvent* event) {
    if (watched == host_ && event->type() == QEvent::Resize) {
        setFrame(QRectF(QPointF(0, 0), QSizeF(host_->size())));
        setNeedsLayout();
    }
    return View::eventFilter(watched, event);
}

QRectF PresentationContainer::panelFrame() const {
    const QRectF area = bounds();
    if (!presented_ || !isPopover())
        return area;
    QSizeF size = presented_->preferredContentSize();
    size = size.boundedTo(QSizeF(area.width() - 2 * kEdge, area.height() - 2 * kEdge));
    QRectF panel(QPointF(0, 0), size);
    panel.moveCenter(area.center());

    QWidget* anchor = nullptr;
    if (auto item = presented_->popoverItem()) {
        for (Toolbar* bar : window()->findChildren<Toolbar*>())
            if (QWidget* widget = bar->widgetForItem(item.get()); widget && widget->isVisible())
                anchor = widget;
    }
    if (anchor) {
        const QRectF at(QPointF(mapFromGlobal(anchor->mapToGlobal(QPoint(0, 0)))),
                        QSizeF(anchor->size()));
        // Below the item when there is room, else above it.
        const bool below = at.bottom() + kPopoverGap + size.height() <= area.bottom() - kEdge;
        panel.moveTop(below ? at.bottom() + kPopoverGap : at.top() - kPopoverGap - size.height());
        panel.moveLeft(at.center().x() - size.width() / 2.0);
        panel.moveLeft(
            std::clamp(panel.left(), kEdge, std::max(kEdge, area.right() - kEdge - size.width())));
        panel.moveTop(
            std::clamp(panel.top(), kEdge, std::max(kEdge, area.bottom() - kEdge - size.height())));
    }
    return panel;
}

void PresentationContainer::layoutSubviews() {
    View::layoutSubviews();
    if (presented_ && presented_->isViewLoaded())
        presented_->view()->setFrame(panelFrame());
}

void PresentationContainer::mousePressEvent(QMouseEvent* event) {
    // A press outside a popover's panel dismisses it, as on the toolkit's
    // other platforms; full-screen presentations swallow stray presses.
    event->accept();
    if (isPopover() && !panelFrame().contains(event->position()) && presented_)
        presented_->dismissViewControllerAnimated_completion(true);
}

void PresentationContainer::paintEvent(QPaintEvent* event) {
    View::paintEvent(event);
    if (!isPopover())
        return;
    QPainter painter(this);
    painter.setRenderHint(QPainter::Antialiasing);
    const QRectF panel = panelFrame();
    QPainterPath shadow;
    shadow.addRoundedRect(panel.adjusted(-3, -3, 3, 3), 14, 14);
    painter.fillPath(shadow, QColor(0, 0, 0, 50));
}

} // namespace platform
