#pragma once

#include "platform/ui/ViewController.h"

#include <QImage>
#include <QObject>
#include <QPointer>
#include <QString>
#include <QVariantList>

#include <functional>
#include <memory>

namespace platform {

// Where an activity shows in the activity sheet: among the actions on the
// file, or among the ways of sharing it.
enum class ActivityCategory { Action = 0, Share = 1 };

// One thing the activity sheet can do with its items: the built-in ones
// (mail, copy, ...) and the application's own (publishing, say).
//
// Items are the sheet's items as given: texts (QString) and links or files
// (QUrl), in order. The sheet calls, on the main thread and in this order:
// the identity; canPerformWithActivityItems with the items, to decide whether
// to offer the activity; once the user picks it, prepareWithActivityItems;
// then activityViewController, and when that gives a controller the sheet
// presents it, otherwise performActivity. Either way the activity ends
// itself, exactly once, with activityDidFinish; the sheet then reports the
// activity's type and the completed flag to its own completion.
//
// Ownership: the sheet holds its activities (std::shared_ptr) until it has
// reported. Main thread only.
class Activity : public QObject, public std::enable_shared_from_this<Activity> {
    Q_OBJECT
  public:
    ~Activity() override;

    // Identity.
    virtual QString activityType() const = 0;
    virtual QString activityTitle() const = 0;
    // The sheet's icon for the activity; a null image shows the title alone.
    virtual QImage activityImage() const { return {}; }
    // The same picture as a settings list shows it; by default the icon.
    virtual QImage _activitySettingsImage() const { return activityImage(); }
    // Where the activity stands in the sheet; the same for every instance of
    // a class.
    virtual ActivityCategory activityCategory() const { return ActivityCategory::Action; }

    // Whether the activity can work on these items here and now.
    virtual bool canPerformWithActivityItems(const QVariantList& items) = 0;
    // Called once the user has picked the activity, before anything else.
    virtual void prepareWithActivityItems(const QVariantList& items) {}
    // A controller for the sheet to present in place of performActivity, or
    // null. The activity dismisses nothing itself: finishing does.
    virtual std::shared_ptr<ViewController> activityViewController() { return nullptr; }
    // The work of an activity without a controller. The default finishes at
    // once, not completed.
    virtual void performActivity() { activityDidFinish(false); }

    // Ends the activity. Only the first call counts; later ones are ignored.
    void activityDidFinish(bool completed);
    bool isFinished() const { return finished_; }

    // For the sheet: what to run when the activity finishes; arms the
    // activity for one more finish.
    void setFinishHandler(std::function<void(bool completed)> handler);

    // The controller the sheet was presented from, set by the sheet before
    // prepareWithActivityItems, for an activity that opens a window of its
    // own (a file dialog, say). Held weakly; null outside a sheet.
    ViewController* presenter() const { return presenter_; }
    void setPresenter(ViewController* presenter) { presenter_ = presenter; }

  signals:
    // An activity that learns only later whether it can work here (it asks
    // another program) says so; the sheet then asks canPerform again.
    void availabilityChanged();

  private:
    QPointer<ViewController> presenter_;
    std::function<void(bool completed)> onFinish_;
    bool finished_ = false;
};

} // namespace platform
