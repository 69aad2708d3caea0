#pragma once

#include <QHash>
#include <QString>
#include <optional>

namespace platform {

// The [Desktop Entry] group of a desktop entry file, as its keys and values
// (escapes resolved). Localised keys "Name[de_AT]" are kept under their full
// name.
class DesktopEntry {
  public:
    // Null when the file is missing, unreadable or has no [Desktop Entry].
    static std::optional<DesktopEntry> read(const QString& hostPath);
    static std::optional<DesktopEntry> parse(const QString& text);

    bool contains(const QString& key) const { return values_.contains(key); }
    QString value(const QString& key) const { return values_.value(key); }

    // The localised variants of `key`, by localisation with "-" for the
    // region ("de-AT" for Name[de_AT]); the modifier part (@...) is dropped.
    QHash<QString, QString> localizedValues(const QString& key) const;

  private:
    QHash<QString, QString> values_;
};

} // namespace platform
