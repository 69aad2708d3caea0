#include "EditorSnapshot.h"

#include "platform/ui/share/ActivityViewController.h"

#include <QJsonArray>
#include <cmath>

using platform::ToolbarItem;

namespace EditorSnapshot {
namespace {

QList<std::pair<QString, std::shared_ptr<ToolbarItem>>> namedItems(TXVideoEditorViewController& e) {
    return {
        {QStringLiteral("shareButton"), e.shareButton},
        {QStringLiteral("pauseButton"), e.pauseButton},
        {QStringLiteral("saveButton"), e.saveButton},
        {QStringLiteral("flexSpace"), e.flexSpace},
        {QStringLiteral("doneButton"), e.doneButton},
        {QStringLiteral("cancelButton"), e.cancelButton},
        {QStringLiteral("cancelTrimButton"), e.cancelTrimButton},
        {QStringLiteral("trimButton"), e.trimButton},
        {QStringLiteral("undoButton"), e.undoButton},
        {QStringLiteral("titleButton"), e.titleButton},
        {QStringLiteral("playButton"), e.playButton},
        {QStringLiteral("fixSpace"), e.fixSpace},
    };
}

QJsonValue seconds(double value) {
    return std::isfinite(value) ? QJsonValue(value) : QJsonValue();
}

QJsonArray itemNames(TXVideoEditorViewController& editor, const platform::Toolbar* bar) {
    QJsonArray names;
    for (const auto& item : bar->items())
        names.append(nameOfItem(editor, item.get()));
    return names;
}

// The open share sheet: what it offers, in order, and its items as text.
QJsonValue shareSheet(TXVideoEditorViewController& editor) {
    auto* sheet = dynamic_cast<platform::ActivityViewController*>(editor.presentedViewController());
    if (!sheet || sheet->hasReported())
        return QJsonValue::Null;
    QJsonArray offered;
    for (const auto& activity : sheet->offeredActivities())
        offered.append(activity->activityType());
    return QJsonObject{
        {QStringLiteral("activityTypes"), offered},
        {QStringLiteral("items"),
         QJsonArray::fromStringList(
             platform::ActivityViewController::describeItems(sheet->activityItems()))},
    };
}

} // namespace

std::shared_ptr<ToolbarItem> itemNamed(TXVideoEditorViewController& editor, const QString& name) {
    for (const auto& [itemName, item] : namedItems(editor))
        if (itemName == name)
            return item;
    return nullptr;
}

QString nameOfItem(TXVideoEditorViewController& editor, const ToolbarItem* item) {
    for (const auto& [itemName, candidate] : namedItems(editor))
        if (candidate.get() == item)
            return itemName;
    return QString();
}

QString focusedControl(TXVideoEditorViewController& editor) {
    const QWidget* focus = editor.isViewLoaded() ? editor.view()->window()->focusWidget() : nullptr;
    if (!focus)
        return QString();
    if (focus == editor.avTrimmer.get())
        return QStringLiteral("avTrimmer");
    for (const QWidget* overlay = focus; overlay; overlay = overlay->parentWidget())
        if (overlay == editor.videoOverlayPlayButtonView.get())
            return QStringLiteral("videoOverlayPlayButton");
    for (platform::Toolbar* bar : {editor.topToolBar.get(), editor.bottomToolBar.get()})
        for (const auto& item : bar ? bar->items() : platform::Toolbar::ItemList())
            if (bar->widgetForItem(item.get()) == focus)
                return nameOfItem(editor, item.get());
    return QString::fromLatin1(focus->metaObject()->className());
}

QJsonObject frames(TXVideoEditorViewController& editor) {
    QJsonObject out;
    if (!editor.isViewLoaded())
        return out;
    const QWidget* window = editor.view()->window();
    auto add = [&](const QString& name, const QWidget* w) {
        if (!w || !w->isVisibleTo(window) || !window->isAncestorOf(w))
            return;
        const QPoint at = w->mapTo(window, QPoint(0, 0));
        out.insert(name, QJsonArray{at.x(), at.y(), w->width(), w->height()});
    };
    add(QStringLiteral("topToolBar"), editor.topToolBar.get());
    add(QStringLiteral("bottomToolBar"), editor.bottomToolBar.get());
    add(QStringLiteral("avTrimmer"), editor.avTrimmer.get());
    add(QStringLiteral("videoOverlayPlayButton"), editor.videoOverlayPlayButtonView.get());
    for (platform::Toolbar* bar : {editor.topToolBar.get(), editor.bottomToolBar.get()})
        for (const auto& item : bar ? bar->items() : platform::Toolbar::ItemList())
            add(nameOfItem(editor, item.get()), bar->widgetForItem(item.get()));
    return out;
}

QJsonObject dump(TXVideoEditorViewController& editor) {
    const bool bottomInView = editor.bottomToolBar && editor.bottomToolBar->superview();
    return QJsonObject{
        {QStringLiteral("introMode"), editor.isIntroMode()},
        {QStringLiteral("trimming"), editor.isTrimming()},
        {QStringLiteral("exporting"), editor.isExporting()},
        {QStringLiteral("scrubbing"), editor.isScrubbing()},
        {QStringLiteral("hasEdit"), editor.hasEdit()},
        {QStringLiteral("padMode"), editor.isPadMode()},
        {QStringLiteral("uiHidden"), editor.isUIHidden()},
        {QStringLiteral("editStartTime"), seconds(editor.editStartTime)},
        {QStringLiteral("editEndTime"), seconds(editor.editEndTime)},
        {QStringLiteral("currentTime"),
         seconds(editor.avPlayer ? editor.avPlayer->currentTime().seconds() : NAN)},
        {QStringLiteral("videoURL"), editor.videoURL.toLocalFile()},
        {QStringLiteral("topToolBar"), itemNames(editor, editor.topToolBar.get())},
        {QStringLiteral("bottomToolBar"),
         bottomInView ? itemNames(editor, editor.bottomToolBar.get()) : QJsonArray()},
        {QStringLiteral("activityTypes"), QJsonArray::fromStringList(editor.activityTypes)},
        {QStringLiteral("shareSheet"), shareSheet(editor)},
        {QStringLiteral("focus"), focusedControl(editor)},
        {QStringLiteral("frames"), frames(editor)},
    };
}

} // namespace EditorSnapshot
