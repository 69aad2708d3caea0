#include "AudioOutput.h"

#include <QFileInfo>
#include <QString>

namespace platform::AudioOutput {

namespace {

QString runtimeDir() {
    return qEnvironmentVariable("XDG_RUNTIME_DIR");
}

bool isSocket(const QString& path) {
    return !path.isEmpty() && QFileInfo::exists(path);
}

} // namespace

bool soundServerReachable() {
    // An explicit server address is trusted as given; otherwise look for the
    // sockets the servers create in the session's runtime directory.
    if (!qEnvironmentVariable("PULSE_SERVER").isEmpty())
        return true;
    const QString dir = runtimeDir();
    if (dir.isEmpty())
        return false;
    const QString pipewire = qEnvironmentVariable("PIPEWIRE_REMOTE", QStringLiteral("pipewire-0"));
    return isSocket(dir + u'/' + pipewire) || isSocket(dir + QStringLiteral("/pulse/native"));
}

QByteArray mpvOption() {
    if (qEnvironmentVariable("TAMSEL_AUDIO") == QStringLiteral("null") || !soundServerReachable())
        return QByteArrayLiteral("null");
    // A list: libmpv takes the first output that opens, and null is always
    // there to fall back on.
    return QByteArrayLiteral("pipewire,pulse,null");
}

} // namespace platform::AudioOutput
