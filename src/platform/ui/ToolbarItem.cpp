#include "platform/ui/ToolbarItem.h"

#include "platform/services/Bundle.h"
#include "platform/ui/SystemIcons.h"

namespace platform {

namespace {

// The framework bundle holds the toolkit's own texts too.
const QString kFrameworkPath = QStringLiteral("/System/Library/Frameworks/Tamsel.framework");

struct Titles {
    const char* key;
    const char* fallback; // when the framework is not installed
};

Titles titlesOf(ToolbarItem::SystemItem item) {
    using S = ToolbarItem::SystemItem;
    switch (item) {
    case S::Done:
        return {"DONE", "Done"};
    case S::Cancel:
        return {"CANCEL", "Cancel"};
    case S::Save:
        return {"SAVE", "Save"};
    case S::Action:
        return {"SHARE", "Share"};
    case S::Undo:
        return {"UNDO", "Undo"};
    case S::Play:
        return {"PLAY", "Play"};
    case S::Pause:
        return {"PAUSE", "Pause"};
    case S::FlexibleSpace:
    case S::FixedSpace:
        break;
    }
    return {nullptr, nullptr};
}

} // namespace

ToolbarItem::ToolbarItem(Kind kind, SystemItem system) : kind_(kind), system_(system) {}

ToolbarItem::~ToolbarItem() {
    delete customView_.data();
}

QString ToolbarItem::localizedTitle(SystemItem item) {
    const Titles titles = titlesOf(item);
    if (!titles.key)
        return {};
    const QString key = QString::fromLatin1(titles.key);
    if (auto bundle = Bundle::bundleWithPath(kFrameworkPath)) {
        const QString text =
            bundle->localizedStringForKey(key, QString(), QStringLiteral("Localizable"));
        if (text != key)
            return text;
    }
    return QString::fromLatin1(titles.fallback);
}

QIcon ToolbarItem::systemIcon(SystemItem item) {
    switch (item) {
    case SystemItem::Action:
        return SystemIcons::icon(SystemIcons::Glyph::Share);
    case SystemItem::Undo:
        return SystemIcons::icon(SystemIcons::Glyph::Undo);
    case SystemItem::Play:
        return SystemIcons::icon(SystemIcons::Glyph::Play);
    case SystemItem::Pause:
        return SystemIcons::icon(SystemIcons::Glyph::Pause);
    default:
        break;
    }
    return {};
}

std::shared_ptr<ToolbarItem> ToolbarItem::systemItem(SystemItem item, Action action) {
    std::shared_ptr<ToolbarItem> made(new ToolbarItem(Kind::System, item));
    made->title_ = localizedTitle(item);
    made->icon_ = systemIcon(item);
    made->action_ = std::move(action);
    return made;
}

std::shared_ptr<ToolbarItem> ToolbarItem::titledItem(const QString& title, Action action) {
    std::shared_ptr<ToolbarItem> made(new ToolbarItem(Kind::Title, SystemItem::Done));
    made->title_ = title;
    made->action_ = std::move(action);
    return made;
}

std::shared_ptr<ToolbarItem> ToolbarItem::imageItem(const QImage& image,
                                                    const QString& accessibleName, Action action) {
    std::shared_ptr<ToolbarItem> made(new ToolbarItem(Kind::Image, SystemItem::Done));
    made->title_ = accessibleName;
    made->icon_ = QIcon(QPixmap::fromImage(image));
    made->action_ = std::move(action);
    return made;
}

std::shared_ptr<ToolbarItem> ToolbarItem::customViewItem(QWidget* view) {
    std::shared_ptr<ToolbarItem> made(new ToolbarItem(Kind::CustomView, SystemItem::Done));
    made->customView_ = view;
    if (view)
        made->title_ = view->accessibleName();
    return made;
}

std::shared_ptr<ToolbarItem> ToolbarItem::fixedSpace(qreal width) {
    std::shared_ptr<ToolbarItem> made(new ToolbarItem(Kind::System, SystemItem::FixedSpace));
    made->width_ = width;
    return made;
}

std::shared_ptr<ToolbarItem> ToolbarItem::flexibleSpace() {
    return std::shared_ptr<ToolbarItem>(new ToolbarItem(Kind::System, SystemItem::FlexibleSpace));
}

bool ToolbarItem::isSpace() const {
    return kind_ == Kind::System &&
           (system_ == SystemItem::FlexibleSpace || system_ == SystemItem::FixedSpace);
}

void ToolbarItem::setTitle(const QString& title) {
    title_ = title;
    emit changed();
}

void ToolbarItem::setWidth(qreal width) {
    width_ = width;
    emit changed();
}

void ToolbarItem::setImageInsets(const QMarginsF& insets) {
    imageInsets_ = insets;
    emit changed();
}

void ToolbarItem::setEnabled(bool enabled) {
    enabled_ = enabled;
    emit changed();
}

void ToolbarItem::setTintColor(const QColor& colour) {
    tint_ = colour;
    emit changed();
}

void ToolbarItem::setShortcut(const QKeySequence& shortcut) {
    shortcut_ = shortcut;
    emit changed();
}

void ToolbarItem::trigger() {
    if (!enabled_ || !action_)
        return;
    // The action may replace this item's toolbar list and drop the item.
    const Action action = action_;
    action();
}

} // namespace platform
