#pragma once

#include "platform/ui/Activity.h"

class QMimeData;

namespace platform {

// Copies the items to the clipboard: the files as a URI list and in the
// forms GNOME's and KDE's file managers paste (as a copy, not a cut), the
// texts and links as plain text. Completes at once.
class CopyToPasteboardActivity final : public Activity {
    Q_OBJECT
  public:
    QString activityType() const override;
    QString activityTitle() const override;
    QImage activityImage() const override;
    bool canPerformWithActivityItems(const QVariantList& items) override;
    void prepareWithActivityItems(const QVariantList& items) override;
    void performActivity() override;

    // What goes to the clipboard for some items; the caller owns it.
    static QMimeData* mimeDataFor(const QVariantList& items);

  private:
    QVariantList items_;
};

} // namespace platform
