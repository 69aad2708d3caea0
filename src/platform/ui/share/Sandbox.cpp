#include "Sandbox.h"

#include <QFileInfo>

namespace platform {

bool isSandboxed() {
    return QFileInfo::exists(QStringLiteral("/.flatpak-info")) || qEnvironmentVariableIsSet("SNAP");
}

} // namespace platform
