#pragma once

#include <QString>
#include <QStringList>
#include <QVariantMap>
#include <memory>
#include <mutex>
#include <unordered_map>

namespace platform {

// A bundle: a directory of resources with per-language folders
// ("<lang>.lproj/") holding string tables ("<Table>.strings"), and an
// information dictionary. Installed applications are bundles too: their
// information comes from their desktop entry.
//
// Bundles are immutable once made and safe to use from any thread; parsed
// string tables are cached inside.
class Bundle {
  public:
    // Keys of the information dictionaries.
    static const QString DisplayNameKey; // "BundleDisplayName"
    static const QString NameKey;        // "BundleName"
    static const QString IdentifierKey;  // "BundleIdentifier"

    // The bundle at a device path (a directory), or null. The same object is
    // returned for the same path for the life of the process. Its information
    // dictionary is read from "Info.json" when there is one, and its
    // localised one from "<lang>.lproj/InfoPlist.strings".
    static std::shared_ptr<Bundle> bundleWithPath(const QString& path);

    // The installed application with that identifier: the desktop entry
    // "<identifier>.desktop" in the applications folders of $XDG_DATA_HOME and
    // $XDG_DATA_DIRS, first match wins. Its display name is the entry's Name,
    // localised by the Name[lang] keys. Null when none is installed.
    static std::shared_ptr<Bundle> bundleWithIdentifier(const QString& identifier);

    // The bundle that holds a platform class, looked up by the class's name;
    // null for a class the platform does not know.
    static std::shared_ptr<Bundle> bundleForClass(const QString& className);

    const QString& bundlePath() const { return path_; }
    QString bundleIdentifier() const { return info_.value(IdentifierKey).toString(); }
    const QVariantMap& infoDictionary() const { return info_; }
    // The information dictionary's localised entries for the user's languages.
    QVariantMap localizedInfoDictionary() const;

    // Language folders present, "de", "en", "pt-BR" ...
    QStringList localizations() const { return localizations_; }
    // The localisations to use, best first: those matching the user's
    // preferred languages (a region falls back to its plain language), then
    // "en", then "Base".
    QStringList preferredLocalizations() const;

    // Host path of "<name>.<type>" in `subdirectory` (may be empty) of the
    // folder of `localization` (or of the bundle's top when it is empty);
    // "" when there is no such file.
    QString pathForResource(const QString& name, const QString& type, const QString& subdirectory,
                            const QString& localization) const;

    // The text for `key` in table `table` ("Localizable" when empty) for the
    // preferred localisations. When no table has it: `value` when that is
    // not empty, else the key itself.
    QString localizedStringForKey(const QString& key, const QString& value,
                                  const QString& table) const;

    // A string table of one localisation, cached; null when it is missing.
    std::shared_ptr<const QVariantMap> stringTable(const QString& table,
                                                   const QString& localization) const;

    Bundle(QString path, QString hostPath, QVariantMap info,
           QHash<QString, QVariantMap> localizedInfo, QStringList localizations);

  private:
    QString path_;     // device path
    QString hostPath_; // where it is on this machine
    QVariantMap info_;
    QHash<QString, QVariantMap> localizedInfo_; // by localisation
    QStringList localizations_;

    mutable std::mutex cacheMutex_;
    mutable std::unordered_map<std::string, std::shared_ptr<const QVariantMap>> tables_;
};

} // namespace platform
