#include "PresentedSnapshot.h"

#include "platform/ui/Animation.h"
#include "platform/ui/NavigationController.h"
#include "platform/ui/ViewAlpha.h"
#include "youtube/TXYouTubeActivityProgressOverlay.h"

#include <QAbstractButton>
#include <QApplication>
#include <QKeyEvent>
#include <QLineEdit>
#include <QMouseEvent>
#include <QPlainTextEdit>
#include <QTextEdit>

using namespace platform;

namespace PresentedSnapshot {
namespace {

QObject* objectProperty(QObject* object, const char* name) {
    return object ? object->property(name).value<QObject*>() : nullptr;
}

// A cell of section 0 of the form's table: row 0 the title, row 1 the
// description.
QObject* formCell(ViewController* form, int row) {
    QObject* cell = nullptr;
    if (QObject* table = objectProperty(form, "_table"))
        QMetaObject::invokeMethod(table, "cellForRowAtIndexPath", Qt::DirectConnection,
                                  Q_RETURN_ARG(QObject*, cell), Q_ARG(int, 0), Q_ARG(int, row));
    return cell;
}

// A widget the user can see and reach: shown, and not faded out.
bool reachable(const QWidget* widget) {
    for (const QWidget* w = widget; w; w = w->parentWidget())
        if (w->isHidden() || ViewAlpha::alpha(w) < 0.01)
            return false;
    return true;
}

// A view that is fully on screen: reachable, and neither it nor what holds
// it is still fading.
bool settled(const QWidget* widget) {
    if (!reachable(widget))
        return false;
    for (const QWidget* w = widget; w; w = w->parentWidget())
        if (Animation::isAnimating(w) || ViewAlpha::presentationAlpha(w) < 0.99)
            return false;
    return true;
}

void click(QWidget* widget) {
    const QPointF centre = QRectF(widget->rect()).center();
    QMouseEvent press(QEvent::MouseButtonPress, centre, widget->mapToGlobal(centre), Qt::LeftButton,
                      Qt::LeftButton, Qt::NoModifier);
    QApplication::sendEvent(widget, &press);
    QMouseEvent release(QEvent::MouseButtonRelease, centre, widget->mapToGlobal(centre),
                        Qt::LeftButton, Qt::NoButton, Qt::NoModifier);
    QApplication::sendEvent(widget, &release);
}

void key(QWidget* widget, int code, Qt::KeyboardModifiers modifiers, const QString& text = {}) {
    QKeyEvent press(QEvent::KeyPress, code, modifiers, text);
    QApplication::sendEvent(widget, &press);
    QKeyEvent release(QEvent::KeyRelease, code, modifiers, text);
    QApplication::sendEvent(widget, &release);
}

// What a button says: its text without mnemonics, else its accessible name
// (buttons that draw their title or icon themselves).
QString titleOf(const QAbstractButton* button) {
    QString text = button->text();
    text.remove(QLatin1Char('&'));
    return text.isEmpty() ? button->accessibleName() : text;
}

// The field of `cell` that takes typing: the cell itself or the first one
// inside it.
QWidget* editorIn(QWidget* cell) {
    auto takesTyping = [](QWidget* widget) {
        if (!reachable(widget) || !widget->isEnabled())
            return false;
        if (auto* line = qobject_cast<QLineEdit*>(widget))
            return !line->isReadOnly();
        if (auto* box = qobject_cast<QPlainTextEdit*>(widget))
            return !box->isReadOnly();
        if (auto* rich = qobject_cast<QTextEdit*>(widget))
            return !rich->isReadOnly();
        return false;
    };
    if (takesTyping(cell))
        return cell;
    for (QWidget* child : cell->findChildren<QWidget*>())
        if (takesTyping(child))
            return child;
    return nullptr;
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

bool isAlertShown(ViewController* from) {
    Alert* shown = alert(from);
    return shown && shown->isViewLoaded() && settled(shown->view());
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
    QObject* cell = formCell(form, 1);
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

bool isPublishingFormOnTop(ViewController* from) {
    ViewController* form = publishingForm(from);
    return form && NavigationController::navigationControllerOf(form) == topOfChain(from) &&
           form->isViewLoaded() && settled(form->view());
}

bool isPublishing(ViewController* from) {
    for (ViewController* c = from; c; c = c->presentedViewController()) {
        if (!c->isViewLoaded())
            continue;
        for (auto* overlay : c->view()->findChildren<TXYouTubeActivityProgressOverlay*>())
            if (overlay->isShowing() && overlay->activityIndicator() && reachable(overlay))
                return true;
    }
    return false;
}

QString pressButton(ViewController* from, const QString& title) {
    ViewController* top = topOfChain(from);
    if (!top || top == from)
        return QStringLiteral("nothing is presented over the editor");
    QStringList titles;
    for (QAbstractButton* button : top->view()->findChildren<QAbstractButton*>()) {
        if (!reachable(button))
            continue;
        const QString shown = titleOf(button);
        if (shown != title) {
            if (!shown.isEmpty())
                titles.append(shown);
            continue;
        }
        if (!button->isEnabled())
            return QStringLiteral("the button %1 is disabled").arg(title);
        click(button);
        return QString();
    }
    if (const Alert* shown = qobject_cast<const Alert*>(top))
        return QStringLiteral("the alert \"%1\" has no button %2 (it has: %3)")
            .arg(shown->title(), title, titles.join(QStringLiteral(", ")));
    return QStringLiteral("no button %1 on screen (there are: %2)")
        .arg(title, titles.join(QStringLiteral(", ")));
}

QString fillField(ViewController* from, const QString& field, const QString& text) {
    const int row = field == QLatin1String("title")         ? 0
                    : field == QLatin1String("description") ? 1
                                                            : -1;
    if (row < 0)
        return QStringLiteral("the form has no field %1 (title, description)").arg(field);
    if (!publishingForm(from))
        return QStringLiteral("no publishing form is shown");
    if (!isPublishingFormOnTop(from))
        return QStringLiteral("the publishing form is covered");
    auto* cell = qobject_cast<QWidget*>(formCell(publishingForm(from), row));
    QWidget* editor = cell ? editorIn(cell) : nullptr;
    if (!editor)
        return QStringLiteral("the form's %1 cannot be edited now").arg(field);
    click(editor);
    key(editor, Qt::Key_A, Qt::ControlModifier);
    key(editor, Qt::Key_Delete, Qt::NoModifier);
    if (!text.isEmpty())
        key(editor, 0, Qt::NoModifier, text);
    return QString();
}

} // namespace PresentedSnapshot
