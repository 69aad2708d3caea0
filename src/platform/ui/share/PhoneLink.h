#pragma once

#include "platform/runtime/Implementation.h"

#include <QList>
#include <QStringList>
#include <QUrl>

#include <functional>
#include <memory>

namespace platform {

// The user's paired phones, reached through KDE Connect. Main thread only;
// each callback runs once, on the main thread.
class PhoneLink {
  public:
    virtual ~PhoneLink() = default;

    // The identifiers of paired devices that can be reached now.
    virtual void reachableDevices(std::function<void(QStringList deviceIds)> done) = 0;
    // Sends the files, then the text (when not empty), to one device; `sent`
    // is true when every part went.
    virtual void share(const QString& deviceId, const QList<QUrl>& files, const QString& text,
                       std::function<void(bool sent)> done) = 0;

    static std::shared_ptr<PhoneLink> sharedLink();
    using Maker = std::shared_ptr<PhoneLink>();
    static Implementation<Maker>& implementation();
};

} // namespace platform
