#include "TempDir.h"

#include <QCryptographicHash>
#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <cstdlib>

namespace testing_support {

void ScopedEnv::remember(const char* name) {
    for (auto& [saved, value] : saved_)
        if (saved == name)
            return;
    saved_.emplace_back(QByteArray(name), qEnvironmentVariableIsSet(name)
                                              ? std::optional<QByteArray>(qgetenv(name))
                                              : std::nullopt);
}

void ScopedEnv::set(const char* name, const QByteArray& value) {
    remember(name);
    qputenv(name, value);
}

void ScopedEnv::unset(const char* name) {
    remember(name);
    qunsetenv(name);
}

ScopedEnv::~ScopedEnv() {
    for (auto it = saved_.rbegin(); it != saved_.rend(); ++it) {
        if (it->second)
            qputenv(it->first.constData(), *it->second);
        else
            qunsetenv(it->first.constData());
    }
}

MobileRoot::MobileRoot() : env_("TAMSEL_MOBILE_ROOT", QByteArray()) {
    env_.set("TAMSEL_MOBILE_ROOT", dir_.path().toLocal8Bit());
}

QString MobileRoot::hostPath(const QString& relative) const {
    return relative.isEmpty() ? dir_.path() : dir_.path() + QLatin1Char('/') + relative;
}

void MobileRoot::makeLibrary(bool withTempDir) const {
    QDir().mkpath(
        hostPath(withTempDir ? QStringLiteral("Library/Tamsel") : QStringLiteral("Library")));
}

void writeFile(const QString& hostPath, qint64 size) {
    QDir().mkpath(QFileInfo(hostPath).absolutePath());
    QFile file(hostPath);
    if (file.open(QIODevice::WriteOnly))
        file.write(QByteArray(size, 'x'));
}

QByteArray hashOf(const QString& path) {
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly))
        return {};
    QCryptographicHash hash(QCryptographicHash::Sha256);
    hash.addData(&file);
    return hash.result();
}

} // namespace testing_support
