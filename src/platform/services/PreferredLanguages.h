#pragma once

#include <QString>
#include <QStringList>

namespace platform {

// The user's preferred languages, most preferred first, as language codes with
// an optional region after "-" ("de-AT", "fr", "ja-JP"). Read on every call, in
// gettext's order: LANGUAGE (a colon-separated list) when the locale is not C,
// else the first non-empty of LC_ALL, LC_MESSAGES, LANG. The C and POSIX
// locales give an empty list.
QStringList preferredLanguages();

// "de_AT.UTF-8@euro" -> "de-AT"; "" for C, POSIX and empty names.
QString languageCodeFromLocaleName(const QString& localeName);

} // namespace platform
