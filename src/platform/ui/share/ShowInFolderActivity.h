#pragma once

#include "platform/ui/Activity.h"

#include <QUrl>

namespace platform {

// Shows the recording (the items' first file) selected in the desktop's file
// manager; where no file manager answers over D-Bus, opens its folder
// instead. Completed when either way worked.
class ShowInFolderActivity final : public Activity {
    Q_OBJECT
  public:
    QString activityType() const override;
    QString activityTitle() const override;
    QImage activityImage() const override;
    bool canPerformWithActivityItems(const QVariantList& items) override;
    void prepareWithActivityItems(const QVariantList& items) override;
    void performActivity() override;

  private:
    QUrl file_;
};

} // namespace platform
