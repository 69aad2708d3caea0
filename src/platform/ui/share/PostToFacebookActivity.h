#pragma once

#include "platform/ui/Activity.h"

#include <QUrl>

namespace platform {

// Posts the items' web link to Facebook through its web share dialog, opened
// in the user's browser: the dialog takes a link, never a file, so the
// activity is offered only when the items hold a web link (http or https).
// Completed when the browser took the address.
class PostToFacebookActivity final : public Activity {
    Q_OBJECT
  public:
    QString activityType() const override;
    QString activityTitle() const override;
    QImage activityImage() const override;
    ActivityCategory activityCategory() const override { return ActivityCategory::Share; }
    bool canPerformWithActivityItems(const QVariantList& items) override;
    void prepareWithActivityItems(const QVariantList& items) override;
    void performActivity() override;

    // The dialog's address for a link.
    static QUrl shareDialogFor(const QUrl& link);

  private:
    QUrl link_;
};

} // namespace platform
