#include "platform/ui/Alert.h"

#include "platform/runtime/Log.h"

#include <QBoxLayout>
#include <QFrame>
#include <QKeyEvent>
#include <QLabel>
#include <QPointer>
#include <QPushButton>
#include <QTimer>

namespace platform {

Alert::Alert(QString title, QString message, Style style)
    : title_(std::move(title)), message_(std::move(message)), style_(style) {
    setModalPresentationStyle(ModalPresentationStyle::OverFullScreen);
}

std::shared_ptr<Alert> Alert::make(const QString& title, const QString& message, Style style) {
    return std::shared_ptr<Alert>(new Alert(title, message, style));
}

void Alert::addAction(const std::shared_ptr<AlertAction>& action) {
    if (!action)
        return;
    if (action->style() == AlertAction::Style::Cancel) {
        for (const auto& existing : std::as_const(actions_))
            if (existing->style() == AlertAction::Style::Cancel) {
                logError(
                    QStringLiteral("An alert can have only one cancel action; \"%1\" not added")
                        .arg(action->title()));
                return;
            }
    }
    actions_.append(action);
    if (isViewLoaded())
        buildButtons();
}

QPushButton* Alert::buttonForAction(const AlertAction* action) const {
    for (QPushButton* button : buttons_)
        if (button->property("tamsel.action").value<void*>() == action)
            return button;
    return nullptr;
}

void Alert::performAction(const std::shared_ptr<AlertAction>& action) {
    if (!action || !action->isEnabled() || performing_)
        return;
    performing_ = true;
    auto self = std::static_pointer_cast<Alert>(shared_from_this());
    dismissViewControllerAnimated_completion(false, [self, action] {
        action->run();
        self->performing_ = false;
    });
}

void Alert::loadView() {
    auto* root = new View();
    root->setBackgroundColor(QColor(0, 0, 0, 100));
    root->setAccessibleName(title_);
    root->installEventFilter(this);
    auto* outer = new QVBoxLayout(root);
    outer->setAlignment(Qt::AlignCenter);

    auto* card = new QFrame(root);
    card->setObjectName(QStringLiteral("alertCard"));
    card->setStyleSheet(
        QStringLiteral("#alertCard { background: rgba(250,250,250,245); border-radius: 14px; }"
                       "#alertCard QPushButton { padding: 8px 18px; min-width: 90px; }"));
    card->setMinimumWidth(270);
    card->setMaximumWidth(360);
    auto* column = new QVBoxLayout(card);
    column->setContentsMargins(18, 18, 18, 12);

    auto* titleLabel = new QLabel(title_, card);
    QFont bold = titleLabel->font();
    bold.setBold(true);
    titleLabel->setFont(bold);
    titleLabel->setAlignment(Qt::AlignCenter);
    titleLabel->setWordWrap(true);
    titleLabel->setVisible(!title_.isEmpty());
    column->addWidget(titleLabel);
    auto* messageLabel = new QLabel(message_, card);
    messageLabel->setAlignment(Qt::AlignCenter);
    messageLabel->setWordWrap(true);
    messageLabel->setVisible(!message_.isEmpty());
    column->addWidget(messageLabel);

    auto* row = new QWidget(card);
    row->setObjectName(QStringLiteral("alertButtons"));
    column->addWidget(row);
    outer->addWidget(card, 0, Qt::AlignCenter);
    setView(root);
    buildButtons();
}

void Alert::buildButtons() {
    QWidget* row = view()->findChild<QWidget*>(QStringLiteral("alertButtons"));
    if (!row)
        return;
    qDeleteAll(buttons_);
    buttons_.clear();
    delete row->layout();

    // The cancel action goes last, where the eye ends.
    QList<std::shared_ptr<AlertAction>> ordered;
    std::shared_ptr<AlertAction> cancel;
    for (const auto& action : std::as_const(actions_)) {
        if (action->style() == AlertAction::Style::Cancel)
            cancel = action;
        else
            ordered.append(action);
    }
    if (cancel)
        ordered.append(cancel);

    QBoxLayout* layout = ordered.size() <= 2 ? static_cast<QBoxLayout*>(new QHBoxLayout(row))
                                             : static_cast<QBoxLayout*>(new QVBoxLayout(row));
    layout->setContentsMargins(0, 8, 0, 0);
    for (const auto& action : ordered) {
        auto* button = new QPushButton(action->title(), row);
        button->setProperty("tamsel.action", QVariant::fromValue<void*>(action.get()));
        button->setAccessibleName(action->title());
        button->setEnabled(action->isEnabled());
        if (action->style() == AlertAction::Style::Destructive)
            button->setStyleSheet(QStringLiteral("color: #c0392b;"));
        button->installEventFilter(this);
        std::weak_ptr<AlertAction> weak = action;
        connect(button, &QPushButton::clicked, this, [this, weak] {
            if (auto strong = weak.lock())
                performAction(strong);
        });
        layout->addWidget(button);
        buttons_.append(button);
    }
    // Focus on the default action once shown, so Return and Space pick it.
    // The buttons go with the alert's view, which may go before the alert
    // does: the timer is tied to the view, not to the alert.
    if (buttons_.isEmpty())
        return;
    QTimer::singleShot(0, buttons_.first()->parentWidget(), [alert = QPointer<Alert>(this)] {
        if (!alert)
            return;
        for (QPushButton* button : std::as_const(alert->buttons_)) {
            auto* action =
                static_cast<AlertAction*>(button->property("tamsel.action").value<void*>());
            if (action && action->style() != AlertAction::Style::Cancel) {
                button->setFocus();
                return;
            }
        }
        if (!alert->buttons_.isEmpty())
            alert->buttons_.first()->setFocus();
    });
}

bool Alert::eventFilter(QObject* watched, QEvent* event) {
    if (event->type() == QEvent::KeyPress) {
        const int key = static_cast<QKeyEvent*>(event)->key();
        if (key == Qt::Key_Escape || key == Qt::Key_Return || key == Qt::Key_Enter) {
            const bool wantCancel = key == Qt::Key_Escape;
            if (!wantCancel) {
                if (auto* button = qobject_cast<QPushButton*>(watched)) {
                    button->click();
                    return true;
                }
            }
            for (const auto& action : std::as_const(actions_)) {
                const bool isCancel = action->style() == AlertAction::Style::Cancel;
                if (isCancel == wantCancel) {
                    performAction(action);
                    return true;
                }
            }
        }
    }
    return ViewController::eventFilter(watched, event);
}

} // namespace platform
