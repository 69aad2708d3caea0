#pragma once

#include "platform/ui/share/FileManagerService.h"

#include <QDBusConnection>

namespace platform {

// ShowItems on the session bus's org.freedesktop.FileManager1 (Nautilus,
// Dolphin, Nemo, Thunar ... and the portal-less sandbox's host through the
// bus). Fails when no file manager owns the name.
class DBusFileManager final : public FileManagerService {
  public:
    explicit DBusFileManager(QDBusConnection bus = QDBusConnection::sessionBus());
    void showItems(const QList<QUrl>& files, std::function<void(bool shown)> done) override;

  private:
    QDBusConnection bus_;
};

} // namespace platform
