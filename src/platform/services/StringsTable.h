#pragma once

#include <QString>
#include <QVariantMap>
#include <optional>

namespace platform {

// Reads a string table: a UTF-8 (or UTF-16 with a byte-order mark) file of
// lines `"KEY" = "text";`, with block and line comments and the usual
// backslash escapes (quote, backslash, n, t, r, UXXXX). Keys may also be bare
// words. Returns nullopt when the file is missing, unreadable or malformed.
// Safe from any thread.
std::optional<QVariantMap> readStringsFile(const QString& hostPath);

// The same for a file's bytes already in memory.
std::optional<QVariantMap> parseStringsData(const QByteArray& bytes);

// The same for text already decoded.
std::optional<QVariantMap> parseStrings(const QString& text);

} // namespace platform
