#pragma once

#include "platform/ui/Activity.h"
#include "platform/ui/share/MailComposer.h"

namespace platform {

// Sends the items by mail: the texts and links make the body, the files are
// attached, and the user's mail program opens its composer with them.
// Offered once the composer service says a mail program is there (asked when
// the activity is made). Completed when the mail program took the draft.
class MailActivity final : public Activity {
    Q_OBJECT
  public:
    MailActivity();

    QString activityType() const override;
    QString activityTitle() const override;
    QImage activityImage() const override;
    ActivityCategory activityCategory() const override { return ActivityCategory::Share; }
    bool canPerformWithActivityItems(const QVariantList& items) override;
    void prepareWithActivityItems(const QVariantList& items) override;
    void performActivity() override;

    // The draft for some items.
    static MailDraft draftFor(const QVariantList& items);

  private:
    std::shared_ptr<MailComposer> composer_;
    bool available_ = false;
    MailDraft draft_;
};

} // namespace platform
