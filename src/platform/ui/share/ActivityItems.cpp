#include "ActivityItems.h"

#include <QFileInfo>

namespace platform::ActivityItems {

namespace {
bool isUrl(const QVariant& item) {
    return item.typeId() == QMetaType::QUrl;
}
bool isWeb(const QUrl& url) {
    return url.isValid() && !url.host().isEmpty() &&
           (url.scheme() == QLatin1String("https") || url.scheme() == QLatin1String("http"));
}
} // namespace

QList<QUrl> files(const QVariantList& items) {
    QList<QUrl> out;
    for (const QVariant& item : items)
        if (isUrl(item) && item.toUrl().isLocalFile() &&
            QFileInfo(item.toUrl().toLocalFile()).isFile())
            out.append(item.toUrl());
    return out;
}

QStringList texts(const QVariantList& items) {
    QStringList out;
    for (const QVariant& item : items)
        if (item.typeId() == QMetaType::QString)
            out.append(item.toString());
    return out;
}

QList<QUrl> links(const QVariantList& items) {
    QList<QUrl> out;
    for (const QVariant& item : items)
        if (isUrl(item) && !item.toUrl().isLocalFile() && !item.toUrl().isEmpty())
            out.append(item.toUrl());
    return out;
}

QList<QUrl> webLinks(const QVariantList& items) {
    QList<QUrl> out;
    for (const QVariant& item : items) {
        const QUrl url =
            isUrl(item) ? item.toUrl() : QUrl(item.toString().trimmed(), QUrl::StrictMode);
        if (isWeb(url))
            out.append(url);
    }
    return out;
}

QString messageText(const QVariantList& items) {
    QStringList lines;
    for (const QVariant& item : items) {
        if (item.typeId() == QMetaType::QString) {
            if (!item.toString().isEmpty())
                lines.append(item.toString());
        } else if (isUrl(item) && !item.toUrl().isLocalFile() && !item.toUrl().isEmpty()) {
            lines.append(item.toUrl().toString());
        }
    }
    return lines.join(QLatin1Char('\n'));
}

} // namespace platform::ActivityItems
