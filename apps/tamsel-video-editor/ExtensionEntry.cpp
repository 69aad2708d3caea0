#include "ExtensionEntry.h"

#include <QCloseEvent>
#include <QTimer>

using namespace platform;

ExtensionEntry::ExtensionEntry(ExtensionEndpoint& endpoint)
    : endpoint_(endpoint),
      keyboard_(new EditorKeyboard(&window_, [this]() -> TXVideoEditorViewController* {
          return principal_ ? principal_->videoEditorViewController.get() : nullptr;
      })) {
    window_.setWindowTitle(QStringLiteral("Tamsel"));
    window_.resize(960, 600);
    window_.installEventFilter(this);
    endpoint_.onRequest = [this](QList<ExtensionItem> items) { beginRequest(items); };
    endpoint_.onDismiss = [this] { endRequest(); };
    endpoint_.onHostGone = [this] { endRequest(); };
}

bool ExtensionEntry::eventFilter(QObject* watched, QEvent* event) {
    if (watched == &window_ && event->type() == QEvent::Close)
        QTimer::singleShot(0, this, &ExtensionEntry::endRequest);
    // The principal shows the editor by adding its view: its controls are
    // there to be labelled with their keys.
    if (principal_ && principal_->isViewLoaded() && watched == principal_->view() &&
        event->type() == QEvent::ChildAdded)
        keyboard_->editorDidAppear();
    return QObject::eventFilter(watched, event);
}

ExtensionEntry::~ExtensionEntry() {
    endRequest();
    // The members go before the QObject part that would take the filters
    // down with it, and the window sends its views events as it goes.
    window_.removeEventFilter(this);
    if (principal_ && principal_->isViewLoaded())
        principal_->view()->removeEventFilter(this);
    endpoint_.onRequest = nullptr;
    endpoint_.onDismiss = nullptr;
    endpoint_.onHostGone = nullptr;
}

void ExtensionEntry::beginRequest(const QList<ExtensionItem>& inputItems) {
    if (principal_ || ended_)
        return; // one request per extension process
    auto connection = std::make_shared<AuxiliaryConnection>(
        endpoint_.channel(), TXVideoEditorExtensionContext::_extensionAuxiliaryVendorProtocol(),
        TXVideoEditorExtensionContext::_extensionAuxiliaryHostProtocol());
    context_ = std::make_shared<TXVideoEditorExtensionContext>(inputItems, connection);
    principal_ = TXVideoEditorExtensionViewController::create();
    principal_->extensionContext = context_;
    context_->setPrincipalObject(principal_);
    window_.setRootViewController(principal_);
    principal_->view()->installEventFilter(this);
    window_.show();
    emit requestBegan();
}

void ExtensionEntry::endRequest() {
    if (ended_)
        return;
    ended_ = true;
    // The host removes the extension's view: the principal hears it
    // disappear and tears its editor down.
    window_.hide();
    if (principal_ && principal_->appearance() != ViewController::Appearance::Disappeared)
        principal_->viewDidDisappear(false);
    if (context_)
        context_->_auxiliaryConnection()->flush();
    emit ended();
}
