#include "BundleTXExtensions.h"

#include "platform/services/PreferredLanguages.h"
#include "platform/services/StringsTable.h"

#include <mutex>

using platform::Bundle;

namespace BundleTXExtensions {

std::shared_ptr<Bundle> _txFrameworkBundle() {
    static std::once_flag once;
    static std::shared_ptr<Bundle> bundle;
    std::call_once(once, [] {
        bundle =
            Bundle::bundleWithPath(QStringLiteral("/System/Library/Frameworks/Tamsel.framework"));
    });
    return bundle;
}

QString _txLocalizedAppName(const Bundle& bundle) {
    QString name = bundle.localizedInfoDictionary().value(Bundle::DisplayNameKey).toString();
    if (name.isEmpty())
        name = bundle.infoDictionary().value(Bundle::DisplayNameKey).toString();
    if (name.isEmpty())
        name = bundle.infoDictionary().value(Bundle::NameKey).toString();
    return name.isNull() ? QStringLiteral("") : name;
}

std::optional<QString> _txLocalizedAppNameFromBundleID(const QString& bundleID) {
    const auto bundle = Bundle::bundleWithIdentifier(bundleID);
    if (!bundle)
        return std::nullopt;
    return _txLocalizedAppName(*bundle);
}

std::optional<QVariantMap> localizedDictionaryForLanguage(const QString& language) {
    const auto bundle = _txFrameworkBundle();
    if (!bundle)
        return std::nullopt;
    const QString path = bundle->pathForResource(QStringLiteral("Localizable"),
                                                 QStringLiteral("strings"), QString(), language);
    if (path.isEmpty())
        return std::nullopt;
    return platform::readStringsFile(path);
}

QString _txLocalizedStringFromFrameworkBundleWithKey_bundleID(const QString& key,
                                                              const QString& bundleID) {
    Q_UNUSED(bundleID); // the text does not depend on the recorded application
    const QStringList languages = platform::preferredLanguages();
    if (!languages.isEmpty()) {
        const QString language = languages.first();
        if (auto table = localizedDictionaryForLanguage(language); table && table->contains(key))
            return table->value(key).toString();
        const QString plainLanguage = language.split(QLatin1Char('-')).first();
        if (auto table = localizedDictionaryForLanguage(plainLanguage);
            table && table->contains(key))
            return table->value(key).toString();
    }
    const auto bundle = _txFrameworkBundle();
    return bundle ? bundle->localizedStringForKey(key, QString(), QStringLiteral("Localizable"))
                  : key;
}

} // namespace BundleTXExtensions
