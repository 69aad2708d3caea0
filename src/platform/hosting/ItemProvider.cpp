#include "ItemProvider.h"

#include "platform/runtime/GlobalQueue.h"

#include <QCborArray>
#include <QCborMap>
#include <QColor>

namespace platform {

const QString ItemProvider::GenericDataTypeIdentifier = QStringLiteral("application/octet-stream");

ItemProvider::ItemProvider(QCborValue wireValue, QStringList typeIdentifiers)
    : wire_(std::move(wireValue)), types_(std::move(typeIdentifiers)) {}

std::shared_ptr<ItemProvider> ItemProvider::withItem(const QVariant& item) {
    return std::make_shared<ItemProvider>(encode(item), QStringList{GenericDataTypeIdentifier});
}

bool ItemProvider::hasItemConformingToTypeIdentifier(const QString& typeIdentifier) const {
    // Every registered data type conforms to the generic data type.
    if (typeIdentifier == GenericDataTypeIdentifier)
        return !types_.isEmpty();
    return types_.contains(typeIdentifier);
}

void ItemProvider::loadItemForTypeIdentifier_options_completionHandler(
    const QString& typeIdentifier, const QVariantMap& options, LoadHandler completion) const {
    Q_UNUSED(options);
    const bool available = hasItemConformingToTypeIdentifier(typeIdentifier);
    GlobalQueue::async(QueuePriority::Default, [wire = wire_, typeIdentifier, available,
                                                completion = std::move(completion)] {
        if (!completion)
            return;
        if (!available) {
            completion({}, makeError(UnavailableType, QStringLiteral("ItemProvider"),
                                     QStringLiteral("no item of type %1").arg(typeIdentifier)));
            return;
        }
        const QVariant item = decode(wire);
        if (!item.isValid()) {
            completion({}, makeError(UnreadableItem, QStringLiteral("ItemProvider"),
                                     QStringLiteral("the item cannot be read")));
            return;
        }
        completion(item, nullptr);
    });
}

QCborValue ItemProvider::encode(const QVariant& item) {
    if (item.typeId() == QMetaType::QColor) {
        const QColor colour = item.value<QColor>();
        if (!colour.isValid())
            return {};
        float r, g, b, a;
        colour.getRgbF(&r, &g, &b, &a);
        return QCborMap{{QStringLiteral("colour"), QCborArray{r, g, b, a}}};
    }
    if (item.canConvert<QString>())
        return item.toString();
    return {};
}

QVariant ItemProvider::decode(const QCborValue& wire) {
    if (wire.isString())
        return wire.toString();
    const QCborArray rgba = wire.toMap().value(QStringLiteral("colour")).toArray();
    if (rgba.size() != 4)
        return {};
    float components[4];
    for (int i = 0; i < 4; ++i) {
        if (!rgba[i].isDouble() && !rgba[i].isInteger())
            return {};
        const double c = rgba[i].toDouble();
        if (!(c >= 0.0 && c <= 1.0))
            return {};
        components[i] = float(c);
    }
    return QColor::fromRgbF(components[0], components[1], components[2], components[3]);
}

} // namespace platform
