#pragma once

#include <QAbstractButton>
#include <memory>

namespace platform {

class ToolbarItem;

// The widget a toolbar makes for a titled, image or system item: the item's
// icon tinted with the bar's colour (moved by the item's image insets) or its
// title, drawn at the screen's pixel density. Reached with Tab (a click does
// not take the focus from where the user's keys go) and activated by space or
// return; other keys, arrows included, go on to the window's shortcuts. Its
// accessible name is the item's title; the item's shortcut, when it has one,
// is named in the tooltip and the accessible description. Made and deleted by
// Toolbar only.
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
    void keyPressEvent(QKeyEvent* event) override;

  private:
    void refresh();

    std::shared_ptr<ToolbarItem> item_;
    QColor barTint_;
};

} // namespace platform
