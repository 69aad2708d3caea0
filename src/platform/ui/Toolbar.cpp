#include "platform/ui/Toolbar.h"

#include "platform/ui/Animation.h"
#include "platform/ui/ToolbarItemButton.h"
#include "platform/ui/ViewAlpha.h"

#include <QPainter>

namespace platform {

namespace {
constexpr qreal kSideMargin = 12.0;
constexpr qreal kItemGap = 8.0;
} // namespace

BarPosition ToolbarDelegate::positionForBar(Toolbar& bar) {
    const QWidget* parent = bar.parentWidget();
    if (!parent)
        return BarPosition::Any;
    return bar.frame().center().y() < parent->height() / 2.0 ? BarPosition::Top
                                                             : BarPosition::Bottom;
}

Toolbar::Toolbar(const QRectF& frame, QWidget* parent) : View(frame, parent) {
    setAccessibleName(tr("Toolbar"));
}

Toolbar::~Toolbar() {
    // Custom views belong to their items, which may outlive the bar.
    for (const auto& item : std::as_const(items_))
        if (QWidget* view = item->customView(); view && view->parentWidget() == this)
            view->setParent(nullptr);
}

void Toolbar::clearWidgets() {
    for (int i = 0; i < widgets_.size(); ++i) {
        QWidget* widget = widgets_[i];
        if (!widget)
            continue;
        if (items_[i]->kind() == ToolbarItem::Kind::CustomView) {
            if (widget->parentWidget() == this) {
                widget->hide();
                widget->setParent(nullptr);
            }
        } else {
            // The press that triggered this replacement may still be running
            // inside the old button, so it goes on a later turn.
            widget->hide();
            widget->deleteLater();
        }
    }
    widgets_.clear();
}

void Toolbar::setItems(const ItemList& items, bool animated) {
    // The keyboard stays where it was when a press replaces the list (play
    // becomes pause): on the same item, else on the one in its place.
    int focusedIndex = -1;
    std::shared_ptr<ToolbarItem> focusedItem;
    for (int i = 0; i < widgets_.size(); ++i) {
        if (widgets_[i] && widgets_[i] == window()->focusWidget()) {
            focusedIndex = i;
            focusedItem = items_[i];
            // Let go first, or hiding it would hand the focus down the chain.
            widgets_[i]->clearFocus();
        }
    }
    clearWidgets();
    items_.clear();
    for (const auto& item : items)
        if (item)
            items_.append(item);

    QWidget* previous = nullptr;
    for (const auto& item : std::as_const(items_)) {
        QWidget* widget = nullptr;
        if (item->kind() == ToolbarItem::Kind::CustomView) {
            widget = item->customView();
            if (widget) {
                // An item shows in one bar at a time, as it can only have one
                // place; taking it here takes it from the other bar.
                addSubview(widget);
            }
        } else if (!item->isSpace()) {
            auto* button = new ToolbarItemButton(item, this);
            button->setTint(tint_);
            button->show();
            widget = button;
        }
        widgets_.append(widget);
        if (widget && widget->focusPolicy() != Qt::NoFocus) {
            if (previous)
                QWidget::setTabOrder(previous, widget);
            previous = widget;
        }
        connect(item.get(), &ToolbarItem::changed, this, &Toolbar::setNeedsLayout,
                Qt::UniqueConnection);
    }
    if (animated) {
        for (QWidget* widget : std::as_const(widgets_))
            if (widget)
                ViewAlpha::setPresentationAlpha(widget, 0.0);
        Animation::animateWithDuration(0.2, [this] {
            for (QWidget* widget : std::as_const(widgets_))
                if (widget)
                    ViewAlpha::setAlpha(widget, 1.0);
        });
    }
    setNeedsLayout();
    layoutIfNeeded();
    if (focusedIndex >= 0) {
        QWidget* next = widgetForItem(focusedItem.get());
        if (!next && focusedIndex < widgets_.size())
            next = widgets_[focusedIndex];
        if (next && (next->focusPolicy() & Qt::TabFocus))
            next->setFocus(Qt::OtherFocusReason);
    }
}

void Toolbar::setDelegate(std::weak_ptr<ToolbarDelegate> delegate) {
    delegate_ = std::move(delegate);
    update();
}

BarPosition Toolbar::barPosition() {
    if (auto delegate = delegate_.lock())
        return delegate->positionForBar(*this);
    return ToolbarDelegate().positionForBar(*this);
}

void Toolbar::setTintColor(const QColor& tint) {
    tint_ = tint;
    for (QWidget* widget : std::as_const(widgets_))
        if (auto* button = qobject_cast<ToolbarItemButton*>(widget))
            button->setTint(tint);
}

QWidget* Toolbar::widgetForItem(const ToolbarItem* item) const {
    for (int i = 0; i < items_.size(); ++i)
        if (items_[i].get() == item)
            return widgets_.value(i);
    return nullptr;
}

void Toolbar::layoutSubviews() {
    View::layoutSubviews();
    const QRectF area = bounds();
    QList<qreal> widths;
    qreal used = 0.0;
    int flexible = 0;
    int shown = 0;
    for (int i = 0; i < items_.size(); ++i) {
        const ToolbarItem& item = *items_[i];
        qreal width = 0.0;
        if (item.systemKind() == ToolbarItem::SystemItem::FlexibleSpace &&
            item.kind() == ToolbarItem::Kind::System) {
            ++flexible;
        } else if (item.systemKind() == ToolbarItem::SystemItem::FixedSpace &&
                   item.kind() == ToolbarItem::Kind::System) {
            width = std::max(0.0, item.width());
        } else if (QWidget* widget = widgets_[i]) {
            if (item.kind() == ToolbarItem::Kind::CustomView)
                width = item.width() > 0 ? item.width() : View::frameOf(widget).width();
            else
                width = widget->sizeHint().width();
            ++shown;
        }
        widths.append(width);
        used += width;
    }
    used += kItemGap * std::max(0, shown - 1) + 2 * kSideMargin;
    const qreal flexWidth = flexible > 0 ? std::max(0.0, (area.width() - used) / flexible) : 0.0;

    qreal x = kSideMargin;
    bool placedOne = false;
    for (int i = 0; i < items_.size(); ++i) {
        const ToolbarItem& item = *items_[i];
        if (item.isSpace()) {
            x +=
                item.systemKind() == ToolbarItem::SystemItem::FlexibleSpace ? flexWidth : widths[i];
            continue;
        }
        QWidget* widget = widgets_[i];
        // A custom view that another bar has taken since is not ours to place.
        if (!widget || widget->parentWidget() != this)
            continue;
        if (placedOne)
            x += kItemGap;
        placedOne = true;
        qreal height = item.kind() == ToolbarItem::Kind::CustomView
                           ? View::frameOf(widget).height()
                           : std::min<qreal>(44.0, area.height());
        View::setFrameOf(widget, QRectF(x, (area.height() - height) / 2.0, widths[i], height));
        x += widths[i];
    }
}

void Toolbar::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    const QRectF area = bounds();
    painter.fillRect(area,
                     backgroundColor().isValid() ? backgroundColor() : QColor(247, 247, 247, 235));
    // The hairline faces the content the bar sits against.
    const BarPosition position = barPosition();
    painter.setPen(QPen(QColor(0, 0, 0, 60), 0));
    if (position == BarPosition::Top || position == BarPosition::TopAttached)
        painter.drawLine(QPointF(0, area.height() - 0.5),
                         QPointF(area.width(), area.height() - 0.5));
    else
        painter.drawLine(QPointF(0, 0.5), QPointF(area.width(), 0.5));
}

} // namespace platform
