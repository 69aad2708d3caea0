#pragma once

#include <QAbstractButton>
#include <memory>

namespace platform {

class ToolbarItem;

// The widget a toolbar makes for a titled, image or system item: the item's
// icon tinted with the bar's colour (moved by the item's image insets) or its
// title. Focusable and activated by space or return; its accessible name is
// the item's title. Made and deleted by Toolbar only.
class ToolbarItemButton : public QAbstractButton {
    Q_OBJECT
  public:
    ToolbarItemButton(std::shared_ptr<ToolbarItem> item, QWidget* parent);

    ToolbarItem* item() const { return item_.get(); }
    void setTint(const QColor& tint);
    QColor effectiveTint() const;
    QSize sizeHint() const override;

    static constexpr int IconSide = 24;

  protected:
    void paintEvent(QPaintEvent* event) override;

  private:
    void refresh();

    std::shared_ptr<ToolbarItem> item_;
    QColor barTint_;
};

} // namespace platform
