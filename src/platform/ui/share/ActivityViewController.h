#pragma once

#include "platform/runtime/Error.h"
#include "platform/runtime/Implementation.h"
#include "platform/ui/Activity.h"
#include "platform/ui/ViewController.h"

#include <QList>
#include <QStringList>
#include <QVariantList>

#include <functional>
#include <memory>

namespace platform {

// The activity sheet: offers what can be done with some items (texts as
// QString, links and files as QUrl) and runs the activity the user picks.
// It lists the built-in activities that can work on this desktop and the
// application activities it was given, without the excluded types, those
// named in the preferred order first and in that order.
//
// Present it like any controller: a popover (anchored with setPopoverItem)
// or full screen. It ends once, reporting to its completion the picked
// activity's type and whether the activity completed (a null type and false
// when the user cancelled); returned items and error are passed on as the
// activity leaves them (none, so far). The sheet dismisses itself before an
// activity works, and keeps itself alive until it has reported.
//
// This class holds what is configured and the report; the sheet itself is
// made by implementation(). Main thread only.
class ActivityViewController : public ViewController {
    Q_OBJECT
  public:
    using CompletionWithItemsHandler =
        std::function<void(const QString& activityType, bool completed,
                           const QVariantList& returnedItems, ErrorPtr activityError)>;
    using ActivityList = QList<std::shared_ptr<Activity>>;

    // The sheet from implementation(): the desktop's unless a test replaced it.
    static std::shared_ptr<ActivityViewController>
    initWithActivityItems_applicationActivities(const QVariantList& activityItems,
                                                const ActivityList& applicationActivities);
    using Maker = std::shared_ptr<ActivityViewController>(const QVariantList&, const ActivityList&);
    static Implementation<Maker>& implementation();

    const QVariantList& activityItems() const { return items_; }
    const ActivityList& applicationActivities() const { return applicationActivities_; }

    QStringList excludedActivityTypes() const { return excluded_; }
    void setExcludedActivityTypes(const QStringList& types) { excluded_ = types; }
    // Empty: the sheet's own order.
    QStringList preferredActivityOrder() const { return preferredOrder_; }
    void setPreferredActivityOrder(const QStringList& types) { preferredOrder_ = types; }
    void setCompletionWithItemsHandler(CompletionWithItemsHandler handler) {
        completion_ = std::move(handler);
    }

    // What the sheet offers now, in the order shown.
    virtual ActivityList offeredActivities() = 0;
    // Runs the offered activity of that type (or, failing that, of that
    // title) as the user's pick would; false when none is offered.
    virtual bool performActivityNamed(const QString& typeOrTitle) = 0;
    // What the user's cancel does: dismiss, then report.
    virtual void cancel() = 0;
    // True once the report has gone.
    bool hasReported() const { return reported_; }

    // The items as plain text, for logs and automation: texts as they are,
    // links and files as their addresses.
    static QStringList describeItems(const QVariantList& items);

  protected:
    ActivityViewController(QVariantList activityItems, ActivityList applicationActivities);
    // Calls the completion, the first time only.
    void reportCompletion(const QString& activityType, bool completed,
                          const QVariantList& returnedItems = {}, ErrorPtr error = nullptr);

  private:
    QVariantList items_;
    ActivityList applicationActivities_;
    QStringList excluded_;
    QStringList preferredOrder_;
    CompletionWithItemsHandler completion_;
    bool reported_ = false;
};

} // namespace platform
