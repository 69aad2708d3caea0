#include "Bundle.h"

#include "DesktopEntry.h"
#include "PreferredLanguages.h"
#include "StringsTable.h"
#include "platform/runtime/DevicePaths.h"

#include <QDir>
#include <QFileInfo>
#include <QJsonDocument>
#include <QJsonObject>
#include <QStandardPaths>

namespace platform {

const QString Bundle::DisplayNameKey = QStringLiteral("BundleDisplayName");
const QString Bundle::NameKey = QStringLiteral("BundleName");
const QString Bundle::IdentifierKey = QStringLiteral("BundleIdentifier");

namespace {

const QString kLprojSuffix = QStringLiteral(".lproj");

// Platform classes and the framework bundles that hold them.
const QHash<QString, QString>& classBundles() {
    static const QHash<QString, QString> table = {
        {QStringLiteral("PhotoAlbum"),
         QStringLiteral("/System/Library/Frameworks/TamselPhotos.framework")},
        {QStringLiteral("PhotoPublishingActivity"),
         QStringLiteral("/System/Library/Frameworks/TamselPhotosUI.framework")},
    };
    return table;
}

QVariantMap readInfoJson(const QString& hostDir) {
    QFile file(hostDir + QStringLiteral("/Info.json"));
    if (!file.open(QIODevice::ReadOnly))
        return {};
    return QJsonDocument::fromJson(file.readAll()).object().toVariantMap();
}

std::shared_ptr<Bundle> makeDirectoryBundle(const QString& path) {
    const QString host = QDir::cleanPath(DevicePaths::toHost(path));
    if (!QFileInfo(host).isDir())
        return nullptr;
    QStringList localizations;
    QHash<QString, QVariantMap> localizedInfo;
    const QStringList folders =
        QDir(host).entryList({QStringLiteral("*") + kLprojSuffix}, QDir::Dirs, QDir::Name);
    for (const QString& folder : folders) {
        const QString localization = folder.chopped(kLprojSuffix.size());
        localizations.append(localization);
        if (auto info = readStringsFile(host + QLatin1Char('/') + folder +
                                        QStringLiteral("/InfoPlist.strings")))
            localizedInfo.insert(localization, *info);
    }
    return std::make_shared<Bundle>(path, host, readInfoJson(host), localizedInfo, localizations);
}

std::shared_ptr<Bundle> makeApplicationBundle(const QString& identifier) {
    QStringList dirs;
    QString dataHome = qEnvironmentVariable("XDG_DATA_HOME");
    if (dataHome.isEmpty())
        dataHome = QDir::homePath() + QStringLiteral("/.local/share");
    dirs.append(dataHome);
    QString dataDirs = qEnvironmentVariable("XDG_DATA_DIRS");
    if (dataDirs.isEmpty())
        dataDirs = QStringLiteral("/usr/local/share:/usr/share");
    dirs.append(dataDirs.split(QLatin1Char(':'), Qt::SkipEmptyParts));

    for (const QString& dir : dirs) {
        const QString file =
            dir + QStringLiteral("/applications/") + identifier + QStringLiteral(".desktop");
        auto entry = DesktopEntry::read(file);
        if (!entry)
            continue;
        QVariantMap info{{Bundle::IdentifierKey, identifier}};
        if (entry->contains(QStringLiteral("Name")))
            info.insert(Bundle::DisplayNameKey, entry->value(QStringLiteral("Name")));
        QHash<QString, QVariantMap> localizedInfo;
        QStringList localizations;
        for (auto [localization, name] :
             entry->localizedValues(QStringLiteral("Name")).asKeyValueRange()) {
            localizations.append(localization);
            localizedInfo.insert(localization, QVariantMap{{Bundle::DisplayNameKey, name}});
        }
        return std::make_shared<Bundle>(file, QFileInfo(file).absolutePath(), info, localizedInfo,
                                        localizations);
    }
    return nullptr;
}

} // namespace

Bundle::Bundle(QString path, QString hostPath, QVariantMap info,
               QHash<QString, QVariantMap> localizedInfo, QStringList localizations)
    : path_(std::move(path)), hostPath_(std::move(hostPath)), info_(std::move(info)),
      localizedInfo_(std::move(localizedInfo)), localizations_(std::move(localizations)) {}

std::shared_ptr<Bundle> Bundle::bundleWithPath(const QString& path) {
    // Bundles are process-wide, one per path, like the resources they stand for.
    static std::mutex mutex;
    static QHash<QString, std::shared_ptr<Bundle>> bundles;
    const QString key = DevicePaths::toHost(path);
    std::lock_guard lock(mutex);
    if (auto found = bundles.value(key))
        return found;
    auto bundle = makeDirectoryBundle(path);
    if (bundle)
        bundles.insert(key, bundle);
    return bundle;
}

std::shared_ptr<Bundle> Bundle::bundleWithIdentifier(const QString& identifier) {
    // An identifier is a reverse-DNS name; anything with a path separator in
    // it must not walk out of the applications folders.
    if (identifier.isEmpty() || identifier.contains(QLatin1Char('/')))
        return nullptr;
    return makeApplicationBundle(identifier);
}

std::shared_ptr<Bundle> Bundle::bundleForClass(const QString& className) {
    const QString path = classBundles().value(className);
    return path.isEmpty() ? nullptr : bundleWithPath(path);
}

QStringList Bundle::preferredLocalizations() const {
    QStringList order;
    auto add = [&](const QString& localization) {
        if (localizations_.contains(localization) && !order.contains(localization))
            order.append(localization);
    };
    for (const QString& language : preferredLanguages()) {
        add(language);
        QString underscored = language;
        add(underscored.replace(QLatin1Char('-'), QLatin1Char('_')));
        add(language.section(QLatin1Char('-'), 0, 0));
    }
    add(QStringLiteral("en"));
    add(QStringLiteral("Base"));
    return order;
}

QVariantMap Bundle::localizedInfoDictionary() const {
    const QStringList order = preferredLocalizations();
    return order.isEmpty() ? QVariantMap() : localizedInfo_.value(order.first());
}

QString Bundle::pathForResource(const QString& name, const QString& type,
                                const QString& subdirectory, const QString& localization) const {
    QString dir = hostPath_;
    if (!localization.isEmpty())
        dir += QLatin1Char('/') + localization + kLprojSuffix;
    if (!subdirectory.isEmpty())
        dir += QLatin1Char('/') + subdirectory;
    const QString file =
        dir + QLatin1Char('/') + name + (type.isEmpty() ? QString() : QLatin1Char('.') + type);
    return QFileInfo(file).isFile() ? file : QString();
}

std::shared_ptr<const QVariantMap> Bundle::stringTable(const QString& table,
                                                       const QString& localization) const {
    const std::string key = (localization + QLatin1Char('/') + table).toStdString();
    {
        std::lock_guard lock(cacheMutex_);
        if (auto found = tables_.find(key); found != tables_.end())
            return found->second;
    }
    std::shared_ptr<const QVariantMap> parsed;
    const QString file = pathForResource(table, QStringLiteral("strings"), QString(), localization);
    if (!file.isEmpty())
        if (auto contents = readStringsFile(file))
            parsed = std::make_shared<const QVariantMap>(std::move(*contents));
    std::lock_guard lock(cacheMutex_);
    tables_.emplace(key, parsed);
    return parsed;
}

QString Bundle::localizedStringForKey(const QString& key, const QString& value,
                                      const QString& table) const {
    const QString tableName = table.isEmpty() ? QStringLiteral("Localizable") : table;
    for (const QString& localization : preferredLocalizations()) {
        if (auto strings = stringTable(tableName, localization); strings && strings->contains(key))
            return strings->value(key).toString();
    }
    return value.isEmpty() ? key : value;
}

} // namespace platform
