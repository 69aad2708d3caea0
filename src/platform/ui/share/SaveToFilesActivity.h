#pragma once

#include "platform/ui/Activity.h"

#include <QUrl>

namespace platform {

// Saves a copy of the recording (the items' first file) where the user
// chooses in the save dialog, in Videos by default. The copy is written
// beside its destination under a temporary name and renamed when complete,
// so a failed copy leaves nothing half-written and the recording itself is
// never touched. Completed when the copy is in place; cancelled dialog or a
// failed copy finish not completed (a failure is logged).
class SaveToFilesActivity final : public Activity {
    Q_OBJECT
  public:
    QString activityType() const override;
    QString activityTitle() const override;
    QImage activityImage() const override;
    bool canPerformWithActivityItems(const QVariantList& items) override;
    void prepareWithActivityItems(const QVariantList& items) override;
    void performActivity() override;

    // Copies `source` to `destination` (replacing it) through a temporary
    // file beside it. Any thread. Returns "" or why it failed.
    static QString copyFile(const QString& source, const QString& destination);

  private:
    QUrl file_;
};

} // namespace platform
