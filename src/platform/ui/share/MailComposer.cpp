#include "MailComposer.h"

#include "platform/ui/share/PortalMailComposer.h"
#include "platform/ui/share/Sandbox.h"
#include "platform/ui/share/XdgEmailComposer.h"

namespace platform {

Implementation<MailComposer::Maker>& MailComposer::implementation() {
    static Implementation<Maker> chosen([]() -> std::shared_ptr<MailComposer> {
        // Inside a sandbox xdg-email would start the sandbox's own (absent)
        // mail program; the portal reaches the desktop's.
        if (isSandboxed())
            return std::make_shared<PortalMailComposer>();
        return std::make_shared<XdgEmailComposer>();
    });
    return chosen;
}

std::shared_ptr<MailComposer> MailComposer::sharedComposer() {
    return implementation().make();
}

} // namespace platform
