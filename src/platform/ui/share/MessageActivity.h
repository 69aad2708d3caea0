#pragma once

#include "platform/ui/Activity.h"
#include "platform/ui/share/PhoneLink.h"

namespace platform {

// Sends the files and the text as a message to the user's paired phone.
// Offered once a reachable phone is known (asked when the activity is made);
// the first reachable one gets them. Completed when every part was sent.
class MessageActivity final : public Activity {
    Q_OBJECT
  public:
    MessageActivity();

    QString activityType() const override;
    QString activityTitle() const override;
    QImage activityImage() const override;
    ActivityCategory activityCategory() const override { return ActivityCategory::Share; }
    bool canPerformWithActivityItems(const QVariantList& items) override;
    void prepareWithActivityItems(const QVariantList& items) override;
    void performActivity() override;

  private:
    std::shared_ptr<PhoneLink> link_;
    QStringList devices_;
    QList<QUrl> files_;
    QString text_;
};

} // namespace platform
