#include "DevicePaths.h"

#include <QCoreApplication>
#include <QDir>
#include <QFileInfo>

namespace platform::DevicePaths {
namespace {

const QString kMobilePrefix = QStringLiteral("/private/var/mobile");
const QString kSystemPrefix = QStringLiteral("/System");

QString withoutTrailingSlash(QString path) {
    while (path.size() > 1 && path.endsWith(QLatin1Char('/')))
        path.chop(1);
    return path;
}

QString envPath(const char* name) {
    const QString value = qEnvironmentVariable(name);
    return value.isEmpty() ? QString() : withoutTrailingSlash(value);
}

// `path` is `prefix` itself or lies under it.
bool under(const QString& path, const QString& prefix) {
    return path == prefix || path.startsWith(prefix + QLatin1Char('/'));
}

} // namespace

QString mobileRoot() {
    if (QString root = envPath("TAMSEL_MOBILE_ROOT"); !root.isEmpty())
        return root;
    QString dataHome = envPath("XDG_DATA_HOME");
    if (dataHome.isEmpty())
        dataHome = QDir::homePath() + QStringLiteral("/.local/share");
    return dataHome + QStringLiteral("/tamsel/mobile");
}

QString systemRoot() {
    if (QString root = envPath("TAMSEL_SYSTEM_ROOT"); !root.isEmpty())
        return root;
    if (QCoreApplication::instance()) {
        const QString besideExecutable =
            QCoreApplication::applicationDirPath() + QStringLiteral("/../share/tamsel/System");
        if (QFileInfo(besideExecutable).isDir())
            return QDir::cleanPath(besideExecutable);
    }
    const QString buildTree = QStringLiteral(TAMSEL_BUILD_RESOURCE_DIR "/System");
    if (QFileInfo(buildTree).isDir())
        return buildTree;
    return QStringLiteral(TAMSEL_INSTALL_RESOURCE_DIR "/System");
}

QString toHost(const QString& path) {
    if (under(path, kMobilePrefix))
        return mobileRoot() + path.mid(kMobilePrefix.size());
    if (under(path, kSystemPrefix))
        return systemRoot() + path.mid(kSystemPrefix.size());
    return path;
}

QString toDevice(const QString& hostPath) {
    const QString mobile = mobileRoot();
    if (under(hostPath, mobile))
        return kMobilePrefix + hostPath.mid(mobile.size());
    const QString system = systemRoot();
    if (under(hostPath, system))
        return kSystemPrefix + hostPath.mid(system.size());
    return hostPath;
}

void prepareDevice() {
    QDir().mkpath(mobileRoot() + QStringLiteral("/Library"));
}

QString hostPathOfUrl(const QUrl& url) {
    return url.isLocalFile() ? toHost(url.toLocalFile()) : QString();
}

} // namespace platform::DevicePaths
