#pragma once

#include "platform/services/Bundle.h"

#include <QString>
#include <QVariantMap>
#include <memory>
#include <optional>

// The bundle helpers of the TXExtensions group: the product framework bundle,
// application display names and framework strings in the user's language.
// Callable from any thread.
namespace BundleTXExtensions {

// The product framework bundle, "/System/Library/Frameworks/Tamsel.framework",
// opened once on first use and kept for the life of the process. Null only
// when the framework is not installed.
std::shared_ptr<platform::Bundle> _txFrameworkBundle();

// The bundle's display name: the localised display name, else the plain
// display name, else the bundle name, else "". Never null.
QString _txLocalizedAppName(const platform::Bundle& bundle);

// The display name of the installed application with that identifier; null
// (nullopt) when no such application is installed.
std::optional<QString> _txLocalizedAppNameFromBundleID(const QString& bundleID);

// The framework's text for `key` in the user's first preferred language
// ("de-AT" falls back to "de"), else the framework's own lookup, which gives
// the key itself when no table has it. `bundleID` does not change the text.
QString _txLocalizedStringFromFrameworkBundleWithKey_bundleID(const QString& key,
                                                              const QString& bundleID);

// The framework's whole "Localizable" table for one language; nullopt when
// that language has none or it cannot be read.
std::optional<QVariantMap> localizedDictionaryForLanguage(const QString& language);

} // namespace BundleTXExtensions
