#include "TXVideoEditorExtensionContext.h"

#include "platform/runtime/Log.h"

namespace {

// The host protocol, spoken through a remote-object proxy.
class HostProxy final : public TXVideoEditorExtensionHostProtocol {
  public:
    explicit HostProxy(std::shared_ptr<platform::RemoteObjectProxy> proxy)
        : proxy_(std::move(proxy)) {}
    void extensionDidFinishWithActivityTypes(const QStringList& activityTypes) override {
        proxy_->extensionDidFinishWithActivityTypes(activityTypes);
    }

  private:
    std::shared_ptr<platform::RemoteObjectProxy> proxy_;
};

} // namespace

platform::InterfaceDescription TXVideoEditorExtensionContext::_extensionAuxiliaryVendorProtocol() {
    return platform::InterfaceDescription::interfaceWithProtocol(
        QStringLiteral("TXVideoEditorExtensionProtocol"), {});
}

platform::InterfaceDescription TXVideoEditorExtensionContext::_extensionAuxiliaryHostProtocol() {
    return platform::InterfaceDescription::interfaceWithProtocol(
        QStringLiteral("TXVideoEditorExtensionHostProtocol"),
        {QStringLiteral("extensionDidFinishWithActivityTypes:")});
}

std::shared_ptr<QObject> TXVideoEditorExtensionContext::videoEditorExtensionViewController() const {
    return _principalObject();
}

std::shared_ptr<TXVideoEditorExtensionHostProtocol>
TXVideoEditorExtensionContext::extensionObjectProxy() const {
    auto proxy =
        _auxiliaryConnection()->remoteObjectProxyWithErrorHandler([](platform::ErrorPtr error) {
            platform::logError(
                QStringLiteral("error calling extension - %1").arg(error ? error->code() : 0));
        });
    return std::make_shared<HostProxy>(std::move(proxy));
}
