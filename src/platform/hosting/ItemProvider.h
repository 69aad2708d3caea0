#pragma once

#include "platform/runtime/Error.h"

#include <QCborValue>
#include <QStringList>
#include <QVariant>
#include <functional>

namespace platform {

// One attachment of an input item: a value the host sent, loaded on demand.
// The value stays in its wire form until it is loaded, so a value this side
// cannot read fails its load instead of failing the whole request.
class ItemProvider {
  public:
    // The type every data item conforms to.
    static const QString GenericDataTypeIdentifier; // "application/octet-stream"

    // Load errors.
    enum ErrorCode { UnavailableType = -1000, UnreadableItem = -1100 };

    using LoadHandler = std::function<void(QVariant item, ErrorPtr error)>;

    ItemProvider(QCborValue wireValue, QStringList typeIdentifiers);

    // A provider for a value this side makes (the host side, and tests):
    // QString, or QColor.
    static std::shared_ptr<ItemProvider> withItem(const QVariant& item);

    const QStringList& registeredTypeIdentifiers() const { return types_; }
    bool hasItemConformingToTypeIdentifier(const QString& typeIdentifier) const;

    // Loads the item as `typeIdentifier` and calls `completion` on a worker
    // thread (never on the caller's stack): the item (QString or QColor) and
    // null, or an invalid QVariant and the error. `options` is accepted for
    // symmetry with other loads and not used.
    void loadItemForTypeIdentifier_options_completionHandler(const QString& typeIdentifier,
                                                             const QVariantMap& options,
                                                             LoadHandler completion) const;

    const QCborValue& wireValue() const { return wire_; }

    // Wire form of a value: a text string, or {"colour": [r, g, b, a]} with
    // components in 0..1. Invalid for a value that has no wire form.
    static QCborValue encode(const QVariant& item);
    static QVariant decode(const QCborValue& wire); // invalid QVariant when unreadable

  private:
    QCborValue wire_;
    QStringList types_;
};

} // namespace platform
