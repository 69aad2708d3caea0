#pragma once

#include <QString>
#include <QStringList>
#include <QVariantMap>
#include <optional>

// The dictionary keys of TXStoreInfo; each value equals its name.
extern const QString TXStoreInfoBundleIDKey;
extern const QString TXStoreInfoAppNameKey;
extern const QString TXStoreInfoAuthorKey;
extern const QString TXStoreInfoItemURLKey;
extern const QString TXStoreInfoCategoriesKey;

// The recorded application's public details as the store gives them. A
// property that is absent is nullopt; an empty string is present. A plain
// value; any thread.
class TXStoreInfo {
  public:
    std::optional<QString> bundleID;
    std::optional<QString> appName;
    std::optional<QString> author;  // the developer's name
    std::optional<QString> itemURL; // the application's store page
    std::optional<QStringList> categories;

    // The present properties under their keys, the categories joined with
    // "," (left out when there are none).
    QVariantMap dictionary() const;
};
