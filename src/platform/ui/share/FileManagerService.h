#pragma once

#include "platform/runtime/Implementation.h"

#include <QList>
#include <QUrl>

#include <functional>
#include <memory>

namespace platform {

// The desktop's file manager, asked over D-Bus (org.freedesktop.FileManager1)
// to show files selected in their folder. Main thread only; `done` runs once
// on the main thread with whether a file manager took the request.
class FileManagerService {
  public:
    virtual ~FileManagerService() = default;
    virtual void showItems(const QList<QUrl>& files, std::function<void(bool shown)> done) = 0;

    static std::shared_ptr<FileManagerService> sharedService();
    using Maker = std::shared_ptr<FileManagerService>();
    static Implementation<Maker>& implementation();
};

} // namespace platform
