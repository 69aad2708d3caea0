#include "AutomationDriver.h"

#include "EditorSnapshot.h"
#include "PresentedSnapshot.h"
#include "overlay/TXVideoOverlayButton.h"
#include "platform/runtime/Log.h"
#include "platform/ui/ViewAlpha.h"
#include "platform/ui/share/ActivitySheet.h"

#include <QApplication>
#include <QDeadlineTimer>
#include <QJsonDocument>
#include <QKeyEvent>
#include <QListWidget>
#include <QMouseEvent>
#include <QPointer>
#include <QTimer>
#include <cstdio>

using namespace platform;

namespace {

void sendMouse(QWidget* widget, QEvent::Type type, const QPointF& local, Qt::MouseButtons buttons) {
    const Qt::MouseButton button = type == QEvent::MouseMove ? Qt::NoButton : Qt::LeftButton;
    QMouseEvent event(type, local, widget->mapToGlobal(local), button, buttons, Qt::NoModifier);
    QApplication::sendEvent(widget, &event);
}

void click(QWidget* widget, const QPointF& at) {
    sendMouse(widget, QEvent::MouseButtonPress, at, Qt::LeftButton);
    sendMouse(widget, QEvent::MouseButtonRelease, at, Qt::NoButton);
}

void click(QWidget* widget) {
    click(widget, QRectF(widget->rect()).center());
}

// A widget the user can see and reach: shown, and not faded out.
bool reachable(QWidget* widget) {
    for (QWidget* w = widget; w; w = w->parentWidget())
        if (w->isHidden() || ViewAlpha::alpha(w) < 0.01)
            return false;
    return true;
}

} // namespace

AutomationDriver::AutomationDriver(ExtensionEntry& entry, QList<AutomationCommand> commands)
    : entry_(entry), commands_(std::move(commands)) {
    logObserver_ = addLogObserver([this](LogLevel, const QString& line) {
        std::lock_guard lock(logMutex_);
        logLines_.append(line);
    });
}

AutomationDriver::~AutomationDriver() {
    removeLogObserver(logObserver_);
}

TXVideoEditorViewController* AutomationDriver::editor() const {
    const auto& principal = entry_.principal();
    return principal ? principal->videoEditorViewController.get() : nullptr;
}

void AutomationDriver::start() {
    QTimer::singleShot(0, this, &AutomationDriver::runNext);
}

void AutomationDriver::finish(const QString& failure) {
    if (done_)
        return;
    done_ = true;
    if (!failure.isEmpty()) {
        failed_ = true;
        const AutomationCommand& c = commands_.at(qMin(next_, int(commands_.size()) - 1));
        std::fprintf(stderr, "automation: line %d: %s\n", c.line, qPrintable(failure));
    }
    entry_.endRequest();
}

void AutomationDriver::runNext() {
    if (done_)
        return;
    if (next_ >= commands_.size()) {
        finish();
        return;
    }
    const AutomationCommand& c = commands_.at(next_);
    if (!editor() && c.kind != AutomationCommand::Kind::Wait &&
        c.kind != AutomationCommand::Kind::Sleep) {
        finish(QStringLiteral("there is no editor yet (wait ready first)"));
        return;
    }
    QString failure;
    switch (c.kind) {
    case AutomationCommand::Kind::Tap:
        failure = tap(c.target);
        break;
    case AutomationCommand::Kind::Drag:
        failure = drag(c.target, c.value);
        break;
    case AutomationCommand::Kind::Key:
        key(QKeySequence::fromString(c.text, QKeySequence::PortableText));
        break;
    case AutomationCommand::Kind::Shake:
        entry_.window().shake();
        break;
    case AutomationCommand::Kind::Resize:
        entry_.window().resize(int(c.value), int(c.value2));
        break;
    case AutomationCommand::Kind::Dump: {
        QJsonObject state = EditorSnapshot::dump(*editor());
        const QJsonObject presented = PresentedSnapshot::dump(editor());
        for (auto it = presented.begin(); it != presented.end(); ++it)
            state.insert(it.key(), it.value());
        std::printf("%s\n", QJsonDocument(state).toJson(QJsonDocument::Compact).constData());
        std::fflush(stdout);
        break;
    }
    case AutomationCommand::Kind::Press:
        failure = PresentedSnapshot::pressButton(editor(), c.text);
        break;
    case AutomationCommand::Kind::Fill:
        failure = PresentedSnapshot::fillField(editor(), c.target, c.text);
        break;
    case AutomationCommand::Kind::Screenshot:
        if (qEnvironmentVariableIsSet("DBG_TREE")) {
            QWidget& w = entry_.window();
            for (QWidget* c : w.findChildren<QWidget*>())
                if (c->isVisible()) {
                    QRect g(c->mapTo(&w, QPoint(0, 0)), c->size());
                    std::fprintf(stderr, "DBG %s %s parent=%s %d,%d %dx%d auto=%d\n",
                                 c->metaObject()->className(), qPrintable(c->objectName()),
                                 c->parentWidget() ? c->parentWidget()->metaObject()->className()
                                                   : "",
                                 g.x(), g.y(), g.width(), g.height(), c->autoFillBackground());
                }
        }
        if (!entry_.window().grab().save(c.text, "PNG"))
            failure = QStringLiteral("cannot write %1").arg(c.text);
        break;
    case AutomationCommand::Kind::Dismiss:
        ++next_;
        finish();
        return;
    case AutomationCommand::Kind::Sleep:
        ++next_;
        QTimer::singleShot(int(c.value * 1000), this, &AutomationDriver::runNext);
        return;
    case AutomationCommand::Kind::Wait:
        wait(c);
        return;
    case AutomationCommand::Kind::Share:
        retry([this, target = c.target] { return share(target); }, c.timeout);
        return;
    }
    if (!failure.isEmpty()) {
        finish(failure);
        return;
    }
    ++next_;
    // The next command runs after what this one set off has had a turn.
    QTimer::singleShot(0, this, &AutomationDriver::runNext);
}

QString AutomationDriver::tap(const QString& name) {
    TXVideoEditorViewController& e = *editor();
    QWidget* target = nullptr;
    if (name == QLatin1String("videoOverlayPlayButton")) {
        target = e.videoOverlayPlayButtonView.get();
        if (!target || !target->parentWidget())
            return QStringLiteral("the overlay play button is not on screen");
    } else if (name == QLatin1String("videoOverlay")) {
        target = e.videoOverlay.get();
    } else {
        const auto item = EditorSnapshot::itemNamed(e, name);
        if (!item)
            return QStringLiteral("no item is called %1").arg(name);
        for (Toolbar* bar : {e.topToolBar.get(), e.bottomToolBar.get()})
            if (bar && bar->superview() && !target)
                target = bar->widgetForItem(item.get());
        if (!target)
            return QStringLiteral("%1 is not in a toolbar now").arg(name);
    }
    if (!reachable(target))
        return QStringLiteral("%1 is hidden (tap videoOverlay to show the toolbars)").arg(name);
    click(target);
    return QString();
}

QString AutomationDriver::drag(const QString& part, double seconds) {
    MovieScrubber* scrubber = editor()->avTrimmer.get();
    if (!reachable(scrubber))
        return QStringLiteral("the scrubber is hidden (tap videoOverlay to show it)");
    if (!(scrubber->duration() > 0))
        return QStringLiteral("the scrubber has no movie yet (wait ready first)");
    // Presses go where a hand would take each part: a handle by its grip
    // (outside the range), the playhead anywhere inside the range.
    double from = 0;
    double pressX = 0;
    if (part == QLatin1String("start")) {
        from = scrubber->startValue();
        pressX = scrubber->positionForTime(from) - 3;
    } else if (part == QLatin1String("end")) {
        from = scrubber->endValue();
        pressX = scrubber->positionForTime(from) + 3;
    } else {
        from = (scrubber->startValue() + scrubber->endValue()) / 2;
        pressX = scrubber->positionForTime(from);
    }
    const double y = scrubber->height() / 2.0;
    const double toX =
        pressX + scrubber->positionForTime(seconds) - scrubber->positionForTime(from);
    sendMouse(scrubber, QEvent::MouseButtonPress, QPointF(pressX, y), Qt::LeftButton);
    constexpr int steps = 8;
    for (int i = 1; i <= steps; ++i)
        sendMouse(scrubber, QEvent::MouseMove, QPointF(pressX + (toX - pressX) * i / steps, y),
                  Qt::LeftButton);
    sendMouse(scrubber, QEvent::MouseButtonRelease, QPointF(toX, y), Qt::NoButton);
    return QString();
}

QString AutomationDriver::share(const QString& typeOrTitle) {
    TXVideoEditorViewController* e = editor();
    auto* sheet = e ? dynamic_cast<ActivityViewController*>(e->presentedViewController()) : nullptr;
    if (!sheet || sheet->hasReported())
        return QStringLiteral("no share sheet is open (tap shareButton first)");
    auto* real = dynamic_cast<ActivitySheet*>(sheet);
    QListWidget* list = real ? real->activityList() : nullptr;
    if (typeOrTitle == QLatin1String("cancel")) {
        if (list && reachable(list)) {
            QKeyEvent press(QEvent::KeyPress, Qt::Key_Escape, Qt::NoModifier);
            QApplication::sendEvent(list, &press);
        } else {
            sheet->cancel();
        }
        return QString();
    }
    std::shared_ptr<Activity> picked;
    QStringList offered;
    for (const auto& activity : sheet->offeredActivities()) {
        offered.append(activity->activityType());
        if (!picked && (activity->activityType() == typeOrTitle ||
                        activity->activityTitle().compare(typeOrTitle, Qt::CaseInsensitive) == 0))
            picked = activity;
    }
    if (!picked)
        return QStringLiteral("the sheet offers no %1 (it offers %2)")
            .arg(typeOrTitle, offered.join(QStringLiteral(", ")));
    if (list && reachable(list)) {
        for (int row = 0; row < list->count(); ++row) {
            QListWidgetItem* item = list->item(row);
            if (item->data(Qt::UserRole).toString() != picked->activityType())
                continue;
            list->scrollToItem(item);
            click(list->viewport(), QRectF(list->visualItemRect(item)).center());
            return QString();
        }
        return QStringLiteral("%1 is offered but not listed yet").arg(typeOrTitle);
    }
    sheet->performActivityNamed(picked->activityType());
    return QString();
}

void AutomationDriver::retry(std::function<QString()> attempt, double timeout) {
    retrying_ = std::move(attempt);
    waitDeadline_ = QDeadlineTimer(qint64(timeout * 1000));
    pollRetry();
}

void AutomationDriver::pollRetry() {
    if (done_)
        return;
    const QString why = retrying_();
    if (why.isEmpty()) {
        ++next_;
        QTimer::singleShot(0, this, &AutomationDriver::runNext);
        return;
    }
    if (waitDeadline_.hasExpired()) {
        finish(why);
        return;
    }
    QTimer::singleShot(20, this, &AutomationDriver::pollRetry);
}

void AutomationDriver::key(const QKeySequence& sequence) {
    // Keys go where the user's keys go: to the focused control, and from
    // there up to the window when the control does not take them.
    QWidget* window = &entry_.window();
    QWidget* target = window->focusWidget() ? window->focusWidget() : window;
    const QKeyCombination combination = sequence[0];
    const Qt::Key k = combination.key();
    QString text;
    if (!(combination.keyboardModifiers() & (Qt::ControlModifier | Qt::AltModifier))) {
        if (k == Qt::Key_Space)
            text = QStringLiteral(" ");
        else if (k >= Qt::Key_A && k <= Qt::Key_Z)
            text =
                QChar(combination.keyboardModifiers() & Qt::ShiftModifier ? 'A' + (k - Qt::Key_A)
                                                                          : 'a' + (k - Qt::Key_A));
    }
    QPointer<QWidget> guard(target);
    QKeyEvent press(QEvent::KeyPress, k, combination.keyboardModifiers(), text);
    QApplication::sendEvent(target, &press);
    if (!guard)
        target = window;
    QKeyEvent release(QEvent::KeyRelease, k, combination.keyboardModifiers(), text);
    QApplication::sendEvent(target, &release);
}

bool AutomationDriver::holds(const AutomationCommand& c) {
    if (c.target == QLatin1String("log")) {
        std::lock_guard lock(logMutex_);
        for (qsizetype i = logCursor_; i < logLines_.size(); ++i) {
            if (logLines_[i].contains(c.text)) {
                logCursor_ = i + 1;
                return true;
            }
        }
        return false;
    }
    TXVideoEditorViewController* e = editor();
    if (!e)
        return false;
    const auto& item = e->avPlayer->currentItem();
    if (c.target == QLatin1String("ready"))
        return item && item->status() == PlayerItem::Status::ReadyToPlay;
    if (c.target == QLatin1String("frame"))
        return e->avPlayerLayer && e->avPlayerLayer->isReadyForDisplay();
    if (c.target == QLatin1String("playing"))
        return e->avPlayer->rate() != 0;
    if (c.target == QLatin1String("paused"))
        return e->avPlayer->rate() == 0;
    if (c.target == QLatin1String("exporting=false"))
        return !e->isExporting();
    if (c.target == QLatin1String("alert"))
        return PresentedSnapshot::isAlertShown(e);
    if (c.target == QLatin1String("form"))
        return PresentedSnapshot::isPublishingFormOnTop(e);
    if (c.target == QLatin1String("publishing"))
        return PresentedSnapshot::isPublishing(e);
    return false;
}

void AutomationDriver::wait(const AutomationCommand& c) {
    waiting_ = c;
    waitDeadline_ = QDeadlineTimer(qint64(c.timeout * 1000));
    pollWait();
}

void AutomationDriver::pollWait() {
    if (done_)
        return;
    if (holds(waiting_)) {
        ++next_;
        QTimer::singleShot(0, this, &AutomationDriver::runNext);
        return;
    }
    if (waitDeadline_.hasExpired()) {
        const QString what = waiting_.target == QLatin1String("log")
                                 ? QStringLiteral("log \"%1\"").arg(waiting_.text)
                                 : waiting_.target;
        finish(QStringLiteral("waited %1 s for %2 in vain").arg(waiting_.timeout).arg(what));
        return;
    }
    QTimer::singleShot(20, this, &AutomationDriver::pollWait);
}
