#pragma once

#include "platform/ui/ToolbarDelegate.h"
#include "platform/ui/ToolbarItem.h"
#include "platform/ui/View.h"

#include <QList>
#include <memory>

namespace platform {

// A toolbar: a translucent bar that lays out a list of items from left to
// right. Flexible spaces share what the other items leave; fixed spaces take
// their width; titled and icon items take what they need; custom views keep
// their size (or the item's width). The list is only ever replaced as a
// whole. Items are tinted with the bar's tint colour. Every button is
// reachable with Tab in the order of the list. Main thread only.
class Toolbar : public View {
    Q_OBJECT
  public:
    using ItemList = QList<std::shared_ptr<ToolbarItem>>;

    explicit Toolbar(const QRectF& frame = QRectF(), QWidget* parent = nullptr);
    ~Toolbar() override;

    ItemList items() const { return items_; }
    // Replaces the list. The widgets of the old list go at once (a custom
    // view goes back to its item). Animated: the new items fade in. When one
    // of the old widgets had the keyboard focus, the same item's new widget
    // takes it, else the widget in the same place, if it can.
    void setItems(const ItemList& items, bool animated = false);

    std::weak_ptr<ToolbarDelegate> delegate() const { return delegate_; }
    void setDelegate(std::weak_ptr<ToolbarDelegate> delegate);
    BarPosition barPosition();

    // Invalid: the platform's accent colour.
    QColor tintColor() const { return tint_; }
    void setTintColor(const QColor& tint);

    // The widget that shows `item` in this bar, or null (spaces, items not in
    // the list). Its geometry is the item's place, e.g. for anchoring.
    QWidget* widgetForItem(const ToolbarItem* item) const;

  protected:
    void layoutSubviews() override;
    void paintEvent(QPaintEvent* event) override;

  private:
    void clearWidgets();

    ItemList items_;
    QList<QWidget*> widgets_; // one per item, null for spaces
    std::weak_ptr<ToolbarDelegate> delegate_;
    QColor tint_;
};

} // namespace platform
