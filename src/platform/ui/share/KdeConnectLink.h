#pragma once

#include "platform/ui/share/PhoneLink.h"

namespace platform {

// KDE Connect's command line: `kdeconnect-cli --list-available --id-only`
// names the reachable paired devices; `kdeconnect-cli --device ID --share
// FILE` sends a file and `--share-text TEXT` a text. Without the program no
// device is reachable.
class KdeConnectLink final : public PhoneLink {
  public:
    void reachableDevices(std::function<void(QStringList deviceIds)> done) override;
    void share(const QString& deviceId, const QList<QUrl>& files, const QString& text,
               std::function<void(bool sent)> done) override;
};

} // namespace platform
