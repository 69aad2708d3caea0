#pragma once

#include "platform/ui/share/MailComposer.h"

#include <QDBusConnection>

namespace platform {

// Mail through the XDG desktop portal's Email interface
// (org.freedesktop.portal.Email on the session bus), the way out of a
// sandbox: available when the portal answers for the interface; a draft
// goes to ComposeEmail with the body, the subject and the attachments as
// file descriptors (the portal cannot open the sandbox's paths), and the
// request's Response says whether the mail program took it.
class PortalMailComposer final : public MailComposer {
  public:
    explicit PortalMailComposer(QDBusConnection bus = QDBusConnection::sessionBus());

    void checkAvailability(std::function<void(bool available)> done) override;
    void compose(const MailDraft& draft, std::function<void(bool handedOver)> done) override;

  private:
    QDBusConnection bus_;
};

} // namespace platform
