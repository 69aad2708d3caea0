#pragma once

#include "platform/ui/Activity.h"

// The share sheet's activity that publishes the recording to YouTube through
// the platform's YouTube publishing plug-in. The share sheet creates it with
// its plain initialiser and offers it only where publishing support is
// installed. Main thread only.
class TXYouTubeActivity : public platform::Activity {
    Q_OBJECT
  public:
    static std::shared_ptr<TXYouTubeActivity> init();

    QString activityType() const override;
    QString activityTitle() const override;
    platform::ActivityCategory activityCategory() const override;
    // The items are not looked at: the device decides.
    bool canPerformWithActivityItems(const QVariantList& items) override;

  protected:
    TXYouTubeActivity() = default;
};
