#include "TXStoreInfo.h"

const QString TXStoreInfoBundleIDKey = QStringLiteral("TXStoreInfoBundleIDKey");
const QString TXStoreInfoAppNameKey = QStringLiteral("TXStoreInfoAppNameKey");
const QString TXStoreInfoAuthorKey = QStringLiteral("TXStoreInfoAuthorKey");
const QString TXStoreInfoItemURLKey = QStringLiteral("TXStoreInfoItemURLKey");
const QString TXStoreInfoCategoriesKey = QStringLiteral("TXStoreInfoCategoriesKey");

QVariantMap TXStoreInfo::dictionary() const {
    QVariantMap dictionary;
    if (bundleID)
        dictionary.insert(TXStoreInfoBundleIDKey, *bundleID);
    if (appName)
        dictionary.insert(TXStoreInfoAppNameKey, *appName);
    if (author)
        dictionary.insert(TXStoreInfoAuthorKey, *author);
    if (itemURL)
        dictionary.insert(TXStoreInfoItemURLKey, *itemURL);
    if (categories && !categories->isEmpty())
        dictionary.insert(TXStoreInfoCategoriesKey, categories->join(QLatin1Char(',')));
    return dictionary;
}
