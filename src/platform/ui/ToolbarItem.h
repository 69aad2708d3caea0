#pragma once

#include <QIcon>
#include <QImage>
#include <QKeySequence>
#include <QMarginsF>
#include <QObject>
#include <QPointer>
#include <QWidget>
#include <functional>
#include <memory>

namespace platform {

// An item of a toolbar: a system item (its icon from the desktop's icon theme
// with a drawn fallback, its title in the user's language), a titled or
// image item, a flexible or fixed space, or an item that shows a custom view.
// Items are shared (std::shared_ptr) and placed in toolbars by replacing a
// toolbar's whole list. Main thread only.
class ToolbarItem : public QObject {
    Q_OBJECT
  public:
    enum class SystemItem {
        Done,
        Cancel,
        Save,
        Action, // share
        Undo,
        Play,
        Pause,
        FlexibleSpace,
        FixedSpace,
    };
    enum class Kind { System, Title, Image, CustomView };
    using Action = std::function<void()>;

    static std::shared_ptr<ToolbarItem> systemItem(SystemItem item, Action action = {});
    static std::shared_ptr<ToolbarItem> titledItem(const QString& title, Action action = {});
    static std::shared_ptr<ToolbarItem>
    imageItem(const QImage& image, const QString& accessibleName, Action action = {});
    // The item owns the view from now on and deletes it with itself.
    static std::shared_ptr<ToolbarItem> customViewItem(QWidget* view);
    // A fixed space of `width` points.
    static std::shared_ptr<ToolbarItem> fixedSpace(qreal width);
    static std::shared_ptr<ToolbarItem> flexibleSpace();

    ~ToolbarItem() override;

    Kind kind() const { return kind_; }
    SystemItem systemKind() const { return system_; }
    bool isSpace() const;

    // The localised title; for icon items it is the accessible name.
    QString title() const { return title_; }
    void setTitle(const QString& title);
    QIcon icon() const { return icon_; }
    // Whether the item shows its icon rather than its title.
    bool showsIcon() const { return !icon_.isNull(); }
    // Whether the item is drawn as the bar's main action (bold title).
    bool isProminent() const { return system_ == SystemItem::Done && kind_ == Kind::System; }

    QWidget* customView() const { return customView_; }

    // Width of a fixed space, or of a custom view slot (0: the view's own).
    qreal width() const { return width_; }
    void setWidth(qreal width);

    // Moves the icon inside the item: top, left, bottom, right in points
    // (positive top moves it down, positive left moves it right).
    QMarginsF imageInsets() const { return imageInsets_; }
    void setImageInsets(const QMarginsF& insets);

    bool isEnabled() const { return enabled_; }
    void setEnabled(bool enabled);
    // Overrides the toolbar's tint for this item; invalid to follow the bar.
    QColor tintColor() const { return tint_; }
    void setTintColor(const QColor& colour);

    // The key that presses this item where it is shown, for display only:
    // the item's button names it in its tooltip and accessible description.
    // Whoever binds the key (a ShortcutMap) sets it. Empty: none.
    QKeySequence shortcut() const { return shortcut_; }
    void setShortcut(const QKeySequence& shortcut);

    void setAction(Action action) { action_ = std::move(action); }
    // Runs the action as a press of the item does.
    void trigger();

    // The localised title of a system item, from the framework's string table.
    static QString localizedTitle(SystemItem item);
    // The icon of a system item (null for the text items and spaces).
    static QIcon systemIcon(SystemItem item);

  signals:
    void changed();

  private:
    ToolbarItem(Kind kind, SystemItem system);

    Kind kind_;
    SystemItem system_;
    QString title_;
    QIcon icon_;
    QPointer<QWidget> customView_;
    qreal width_ = 0.0;
    QMarginsF imageInsets_;
    bool enabled_ = true;
    QColor tint_;
    QKeySequence shortcut_;
    Action action_;
};

} // namespace platform
