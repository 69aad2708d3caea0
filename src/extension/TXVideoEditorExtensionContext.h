#pragma once

#include "TXVideoEditorExtensionProtocol.h"
#include "platform/hosting/ExtensionContext.h"

#include <memory>

// The extension context of an editor request: the host's input items and the
// channel back to the host. Made by the extension entry; used on the main
// thread.
class TXVideoEditorExtensionContext : public platform::ExtensionContext,
                                      public TXVideoEditorExtensionProtocol {
  public:
    using platform::ExtensionContext::ExtensionContext;

    static platform::InterfaceDescription _extensionAuxiliaryVendorProtocol();
    static platform::InterfaceDescription _extensionAuxiliaryHostProtocol();

    // The principal view controller the platform made for this request.
    std::shared_ptr<QObject> videoEditorExtensionViewController() const;

    // A fresh proxy of the host on the context's connection. A message that
    // cannot be delivered is logged ("error calling extension - <code>") and
    // dropped.
    std::shared_ptr<TXVideoEditorExtensionHostProtocol> extensionObjectProxy() const;
};
