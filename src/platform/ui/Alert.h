#pragma once

#include "platform/ui/AlertAction.h"
#include "platform/ui/ViewController.h"

#include <QList>

class QPushButton;

namespace platform {

// An alert: a title, an optional message and buttons, in a card over a
// dimmed window. Present it with presentViewController_animated_completion;
// it covers the window and leaves the presenter beneath. Return picks the
// default action (the first non-cancel one), Escape the cancel action; a
// press on a button dismisses the alert and then runs the action's handler.
// Main thread only.
class Alert : public ViewController {
    Q_OBJECT
  public:
    enum class Style { ActionSheet = 0, Alert = 1 };

    static std::shared_ptr<Alert> make(const QString& title, const QString& message,
                                       Style style = Style::Alert);

    QString title() const { return title_; }
    QString message() const { return message_; }
    Style preferredStyle() const { return style_; }

    // Actions show in the order added, the cancel action last. A second
    // cancel action is refused and logged.
    void addAction(const std::shared_ptr<AlertAction>& action);
    QList<std::shared_ptr<AlertAction>> actions() const { return actions_; }

    // What a press on the action's button does: dismiss, then the handler.
    void performAction(const std::shared_ptr<AlertAction>& action);
    // The button of an action once the view is loaded.
    QPushButton* buttonForAction(const AlertAction* action) const;

  protected:
    void loadView() override;
    bool eventFilter(QObject* watched, QEvent* event) override;

  private:
    Alert(QString title, QString message, Style style);
    void buildButtons();

    QString title_;
    QString message_;
    Style style_;
    QList<std::shared_ptr<AlertAction>> actions_;
    QList<QPushButton*> buttons_;
    bool performing_ = false;
};

} // namespace platform
