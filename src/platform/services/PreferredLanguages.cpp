#include "PreferredLanguages.h"

namespace platform {

QString languageCodeFromLocaleName(const QString& localeName) {
    QString name = localeName.section(QLatin1Char('.'), 0, 0).section(QLatin1Char('@'), 0, 0);
    if (name.isEmpty() || name == QLatin1String("C") || name == QLatin1String("POSIX"))
        return QString();
    name.replace(QLatin1Char('_'), QLatin1Char('-'));
    return name;
}

QStringList preferredLanguages() {
    QString locale;
    for (const char* variable : {"LC_ALL", "LC_MESSAGES", "LANG"}) {
        locale = qEnvironmentVariable(variable);
        if (!locale.isEmpty())
            break;
    }
    const QString localeCode = languageCodeFromLocaleName(locale);
    if (localeCode.isEmpty())
        return {};

    QStringList languages;
    for (const QString& entry : qEnvironmentVariable("LANGUAGE").split(QLatin1Char(':'))) {
        const QString code = languageCodeFromLocaleName(entry);
        if (!code.isEmpty() && !languages.contains(code))
            languages.append(code);
    }
    if (languages.isEmpty())
        languages.append(localeCode);
    return languages;
}

} // namespace platform
