#pragma once

#include "ItemProvider.h"

#include <QCborArray>
#include <QList>
#include <QString>
#include <memory>

namespace platform {

// One input item of an extension request: a title and its attachments.
struct ExtensionItem {
    QString attributedTitle; // the plain text of the title
    QList<std::shared_ptr<ItemProvider>> attachments;

    // Wire form: {"title": text, "attachments": [{"types": [text], "value": ...}]}.
    QCborMap toCbor() const;
    // Fields of the wrong type read as empty; never fails.
    static ExtensionItem fromCbor(const QCborValue& wire);
};

QCborArray encodeExtensionItems(const QList<ExtensionItem>& items);
QList<ExtensionItem> decodeExtensionItems(const QCborValue& wire);

} // namespace platform
