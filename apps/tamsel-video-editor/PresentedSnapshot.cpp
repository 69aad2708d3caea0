#include "PresentedSnapshot.h"

#include "platform/ui/NavigationController.h"

#include <QApplication>
#include <QMouseEvent>
#include <QPushButton>

using namespace platform;

namespace PresentedSnapshot {
namespace {

QObject* objectProperty(QObject* object, const char* name) {
    return object ? object->property(name).value<QObject*>() : nullptr;
}

// The form's description cell: section 0, row 1 of its table.
QObject* descriptionCell(ViewController* form) {
    QObject* cell = nullptr;
    if (QObject* table = objectProperty(form, "_table"))
        QMetaObject::invokeMethod(table, "cellForRowAtIndexPath", Qt::DirectConnection,
                                  Q_RETURN_ARG(QObject*, cell), Q_ARG(int, 0), Q_ARG(int, 1));
    return cell;
}

QJsonValue textOrNull(const QVariant& value) {
    return value.isValid() ? QJsonValue(value.toString()) : QJsonValue();
}

} // namespace

ViewController* topOfChain(ViewController* from) {
    ViewController* top = from;
    while (top && top->presentedViewController())
        top = top->presentedViewController();
    return top;
}

Alert* alert(ViewController* from) {
    return qobject_cast<Alert*>(topOfChain(from));
}

ViewController* publishingForm(ViewController* from) {
    for (ViewController* c = from; c; c = c->presentedViewController()) {
        auto* navigation = qobject_cast<NavigationController*>(c);
        if (!navigation || navigation->viewControllers().isEmpty())
            continue;
        ViewController* root = navigation->viewControllers().first().get();
        if (root->metaObject()->indexOfProperty("_table") >= 0)
            return root;
    }
    return nullptr;
}

QJsonObject dump(ViewController* from) {
    const Alert* shown = alert(from);
    ViewController* form = publishingForm(from);
    QObject* cell = descriptionCell(form);
    return QJsonObject{
        {QStringLiteral("alert"), shown ? QJsonValue(shown->title()) : QJsonValue()},
        {QStringLiteral("publishingDescription"),
         cell ? textOrNull(cell->property("value")) : QJsonValue()},
        {QStringLiteral("publishingCategory"),
         form ? textOrNull(form->property("_defaultCategory")) : QJsonValue()},
        {QStringLiteral("uploadProgress"),
         form && form->property("uploadProgress").isValid()
             ? QJsonValue(form->property("uploadProgress").toDouble())
             : QJsonValue()},
    };
}

QString pressAlertAction(ViewController* from, const QString& title) {
    Alert* shown = alert(from);
    if (!shown)
        return QStringLiteral("no alert is shown");
    for (const auto& action : shown->actions()) {
        if (action->title() != title)
            continue;
        QPushButton* button = shown->buttonForAction(action.get());
        if (!button || !button->isVisible() || !button->isEnabled())
            return QStringLiteral("the alert's button %1 cannot be pressed").arg(title);
        const QPointF centre = QRectF(button->rect()).center();
        QMouseEvent press(QEvent::MouseButtonPress, centre, button->mapToGlobal(centre),
                          Qt::LeftButton, Qt::LeftButton, Qt::NoModifier);
        QApplication::sendEvent(button, &press);
        QMouseEvent release(QEvent::MouseButtonRelease, centre, button->mapToGlobal(centre),
                            Qt::LeftButton, Qt::NoButton, Qt::NoModifier);
        QApplication::sendEvent(button, &release);
        return QString();
    }
    QStringList titles;
    for (const auto& action : shown->actions())
        titles.append(action->title());
    return QStringLiteral("the alert \"%1\" has no button %2 (it has: %3)")
        .arg(shown->title(), title, titles.join(QStringLiteral(", ")));
}

} // namespace PresentedSnapshot
