#pragma once

#include "platform/ui/share/MailComposer.h"

namespace platform {

// Mail through xdg-utils: available when `xdg-email` is on the PATH and
// `xdg-mime` names a handler of mailto: links; a draft goes to
// `xdg-email --utf8 [--subject S] --body B --attach FILE... `, which knows
// how each common mail program takes attachments. Its exit status 0 means
// the mail program was started with the draft, not that a composer opened:
// that is logged as such.
class XdgEmailComposer final : public MailComposer {
  public:
    void checkAvailability(std::function<void(bool available)> done) override;
    void compose(const MailDraft& draft, std::function<void(bool handedOver)> done) override;

    // The arguments of xdg-email for a draft.
    static QStringList argumentsFor(const MailDraft& draft);
};

} // namespace platform
