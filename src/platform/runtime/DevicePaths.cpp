#include "DevicePaths.h"

#include <QCoreApplication>
#include <QCryptographicHash>
#include <QDir>
#include <QFileInfo>
#include <QStringList>

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

// Device folders that hold files only (relative to the mobile prefix).
const QStringList kFlatFolders = {QStringLiteral("Library/Tamsel")};

const QChar kSlashStandIn(0x2215); // DIVISION SLASH
const QChar kNulStandIn(0x2400);   // SYMBOL FOR NULL
const QChar kDotStandIn(0x2024);   // ONE DOT LEADER

// `path` is `prefix` itself or lies under it.
bool under(const QString& path, const QString& prefix) {
    return path == prefix || path.startsWith(prefix + QLatin1Char('/'));
}

QString withoutNul(QString text) {
    return text.replace(QChar(0), kNulStandIn);
}

// A name too long for the file system keeps its beginning and its end (where
// the extension is), with a digest of the whole between them, so two long
// names that differ only in the middle stay two files.
QString shortened(const QString& name) {
    if (name.toUtf8().size() <= DevicePaths::MaximumEntryNameBytes)
        return name;
    const QString digest = QString::fromLatin1(
        QCryptographicHash::hash(name.toUtf8(), QCryptographicHash::Sha256).toHex().left(12));
    qsizetype tailStart = qMax<qsizetype>(0, name.size() - 24);
    if (name.at(tailStart).isLowSurrogate())
        ++tailStart;
    const QString tail = name.mid(tailStart);
    const QString middle = QChar(0x2026) + digest; // HORIZONTAL ELLIPSIS
    const qsizetype budget =
        DevicePaths::MaximumEntryNameBytes - tail.toUtf8().size() - middle.toUtf8().size();
    QString head;
    qsizetype bytes = 0;
    for (qsizetype i = 0; i < tailStart; ++i) {
        const qsizetype width = name.at(i).isHighSurrogate() && i + 1 < tailStart ? 2 : 1;
        const qsizetype charBytes = name.mid(i, width).toUtf8().size();
        if (bytes + charBytes > budget)
            break;
        head += name.mid(i, width);
        bytes += charBytes;
        i += width - 1;
    }
    return head + middle + tail;
}

// Everything after a flat folder, as the name of one of its entries.
QString entryName(QString rest) {
    while (rest.startsWith(QLatin1Char('/')))
        rest.remove(0, 1);
    while (rest.endsWith(QLatin1Char('/')))
        rest.chop(1);
    if (rest.isEmpty() || rest == QLatin1String("."))
        return {}; // the folder itself
    rest.replace(QLatin1Char('/'), kSlashStandIn);
    if (rest == QLatin1String(".."))
        rest = QString(2, kDotStandIn);
    return shortened(withoutNul(rest));
}

// The part of a device path after its prefix ("" or "/..."), as a path
// relative to the prefix's root that cannot leave it: ".." steps stop at the
// root, and below a flat folder the rest is one entry name.
QString confined(const QString& rest, bool mobile) {
    QStringList kept;
    qsizetype at = 0;
    while (at < rest.size()) {
        if (mobile && kFlatFolders.contains(kept.join(QLatin1Char('/')))) {
            const QString name = entryName(rest.mid(at));
            if (!name.isEmpty())
                kept.append(name);
            break;
        }
        qsizetype end = rest.indexOf(QLatin1Char('/'), at);
        if (end < 0)
            end = rest.size();
        const QString step = rest.mid(at, end - at);
        at = end + 1;
        if (step.isEmpty() || step == QLatin1String("."))
            continue;
        if (step == QLatin1String("..")) {
            if (!kept.isEmpty())
                kept.removeLast();
            continue;
        }
        kept.append(withoutNul(step));
    }
    return kept.isEmpty() ? QString() : QLatin1Char('/') + kept.join(QLatin1Char('/'));
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
        return mobileRoot() + confined(path.mid(kMobilePrefix.size()), true);
    if (under(path, kSystemPrefix))
        return systemRoot() + confined(path.mid(kSystemPrefix.size()), false);
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
