#include "ExtensionRegistry.h"

#include "platform/runtime/Log.h"

#include <QDir>
#include <QFile>
#include <QJsonDocument>
#include <QJsonObject>
#include <QStandardPaths>

namespace platform {

namespace {

QStringList extensionFolders() {
    QStringList folders;
    QString home = qEnvironmentVariable("XDG_DATA_HOME");
    if (home.isEmpty())
        home = QDir::homePath() + QStringLiteral("/.local/share");
    folders.append(home);
    QString dirs = qEnvironmentVariable("XDG_DATA_DIRS");
    if (dirs.isEmpty())
        dirs = QStringLiteral("/usr/local/share:/usr/share");
    folders.append(dirs.split(QLatin1Char(':'), Qt::SkipEmptyParts));
    for (QString& folder : folders)
        folder += QStringLiteral("/tamsel/extensions");
    return folders;
}

// Identifiers become file names; nothing may lead out of the folder.
bool isFileSafe(const QString& identifier) {
    return !identifier.isEmpty() && !identifier.contains(QLatin1Char('/')) &&
           identifier != QLatin1String(".") && identifier != QLatin1String("..");
}

class ManifestExtensionRegistry final : public ExtensionRegistry {
  public:
    std::optional<ExtensionManifest> extensionWithIdentifier(const QString& identifier,
                                                             bool excludingDisabled) override {
        if (!isFileSafe(identifier))
            return std::nullopt;
        for (const QString& folder : extensionFolders()) {
            const QString path = folder + QLatin1Char('/') + identifier + QStringLiteral(".json");
            QFile file(path);
            if (!file.open(QIODevice::ReadOnly))
                continue;
            const QJsonDocument document = QJsonDocument::fromJson(file.read(1 << 20));
            const QJsonObject object = document.object();
            if (object.value(QLatin1String("identifier")).toString() != identifier) {
                logError(QStringLiteral("ExtensionRegistry: %1 is not a manifest of %2")
                             .arg(path, identifier));
                continue;
            }
            ExtensionManifest manifest;
            manifest.identifier = identifier;
            manifest.name = object.value(QLatin1String("name")).toString();
            manifest.point = object.value(QLatin1String("point")).toString();
            manifest.enabled = object.value(QLatin1String("enabled")).toBool(true);
            manifest.path = path;
            if (excludingDisabled && !manifest.enabled)
                return std::nullopt;
            return manifest;
        }
        return std::nullopt;
    }
};

} // namespace

Implementation<ExtensionRegistry::Maker>& ExtensionRegistry::implementation() {
    static Implementation<Maker> chosen([]() -> std::shared_ptr<ExtensionRegistry> {
        static const auto manifests = std::make_shared<ManifestExtensionRegistry>();
        return manifests;
    });
    return chosen;
}

std::shared_ptr<ExtensionRegistry> ExtensionRegistry::sharedRegistry() {
    return implementation().make();
}

} // namespace platform
