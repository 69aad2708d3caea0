#pragma once

#include "platform/ui/share/ActivityViewController.h"

#include <QPointer>

#include <QLabel>
#include <QListWidget>
#include <QPushButton>

namespace platform {

// The desktop's activity sheet: a card listing the offered activities with
// icon and title. As a popover it stands beside its toolbar item; full
// screen it fills the window with a Cancel button at the bottom. Arrow keys
// move through the list, Return or a click picks, Escape (or, for a popover,
// a press outside it) cancels.
//
// Built-in activities come from SystemActivities; one whose availability is
// learnt later joins the list when it is known. Main thread only.
class ActivitySheet final : public ActivityViewController {
    Q_OBJECT
  public:
    static std::shared_ptr<ActivitySheet> make(const QVariantList& activityItems,
                                               const ActivityList& applicationActivities);

    ActivityList offeredActivities() override;
    bool performActivityNamed(const QString& typeOrTitle) override;
    void cancel() override;

    // The list widget once the view is loaded (tests, automation).
    QListWidget* activityList() const { return list_; }

    void viewDidAppear(bool animated) override;
    void viewDidDisappear(bool animated) override;

  protected:
    void loadView() override;
    bool eventFilter(QObject* watched, QEvent* event) override;

  private:
    ActivitySheet(QVariantList activityItems, ActivityList applicationActivities);
    void rebuildRows();
    void pick(const std::shared_ptr<Activity>& activity);
    void activityFinished(const std::shared_ptr<Activity>& activity, bool completed);
    void releaseSelfLater();

    ActivityList builtIns_;
    std::shared_ptr<Activity> running_;
    std::shared_ptr<ViewController> runningController_;
    std::shared_ptr<ActivityViewController> keepAlive_;
    bool cancelling_ = false;

    QPointer<QListWidget> list_;
    QPointer<QLabel> emptyLabel_;
    QPointer<QPushButton> cancelButton_;
};

} // namespace platform
