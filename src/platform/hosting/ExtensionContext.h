#pragma once

#include "AuxiliaryConnection.h"
#include "ExtensionItem.h"

#include <QList>
#include <QObject>
#include <memory>

namespace platform {

// The context of one extension request: the host's input items, the principal
// object the platform made for the request, and the auxiliary connection to
// the host. Subclasses add the interfaces of their connection.
//
// Made and owned by the extension entry; used on the main thread, except
// inputItems(), which any thread may read.
class ExtensionContext {
  public:
    ExtensionContext(QList<ExtensionItem> inputItems,
                     std::shared_ptr<AuxiliaryConnection> connection);
    virtual ~ExtensionContext() = default;

    const QList<ExtensionItem>& inputItems() const { return inputItems_; }
    const std::shared_ptr<AuxiliaryConnection>& _auxiliaryConnection() const { return connection_; }

    // The principal view controller; held weakly (the entry owns it).
    std::shared_ptr<QObject> _principalObject() const { return principal_.lock(); }
    void setPrincipalObject(std::weak_ptr<QObject> principal) { principal_ = std::move(principal); }

  private:
    QList<ExtensionItem> inputItems_;
    std::shared_ptr<AuxiliaryConnection> connection_;
    std::weak_ptr<QObject> principal_;
};

} // namespace platform
