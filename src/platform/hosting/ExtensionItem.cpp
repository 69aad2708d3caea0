#include "ExtensionItem.h"

#include <QCborMap>

namespace platform {

QCborMap ExtensionItem::toCbor() const {
    QCborArray wireAttachments;
    for (const auto& provider : attachments) {
        QCborArray types;
        for (const QString& type : provider->registeredTypeIdentifiers())
            types.append(type);
        wireAttachments.append(QCborMap{{QStringLiteral("types"), types},
                                        {QStringLiteral("value"), provider->wireValue()}});
    }
    return QCborMap{{QStringLiteral("title"), attributedTitle},
                    {QStringLiteral("attachments"), wireAttachments}};
}

ExtensionItem ExtensionItem::fromCbor(const QCborValue& wire) {
    const QCborMap map = wire.toMap();
    ExtensionItem item;
    item.attributedTitle = map.value(QStringLiteral("title")).toString();
    for (const QCborValue& attachment : map.value(QStringLiteral("attachments")).toArray()) {
        QStringList types;
        for (const QCborValue& type : attachment.toMap().value(QStringLiteral("types")).toArray())
            if (type.isString())
                types.append(type.toString());
        item.attachments.append(std::make_shared<ItemProvider>(
            attachment.toMap().value(QStringLiteral("value")), types));
    }
    return item;
}

QCborArray encodeExtensionItems(const QList<ExtensionItem>& items) {
    QCborArray array;
    for (const ExtensionItem& item : items)
        array.append(item.toCbor());
    return array;
}

QList<ExtensionItem> decodeExtensionItems(const QCborValue& wire) {
    QList<ExtensionItem> items;
    for (const QCborValue& item : wire.toArray())
        items.append(ExtensionItem::fromCbor(item));
    return items;
}

} // namespace platform
