#pragma once

#include "platform/runtime/Implementation.h"

#include <QUrl>

#include <memory>

namespace platform {

// Opens an address in the application the desktop chooses for it: a web page
// in the user's browser, a folder in the file manager, an "appstream:" link in
// the software centre.
//
// Main thread only. openURL returns at once with whether a handler took the
// address; what the handler then does is out of sight.
class UrlOpener {
  public:
    virtual ~UrlOpener() = default;

    virtual bool openURL(const QUrl& url) = 0;

    // The opener from implementation(): the desktop's (xdg-open) unless a test
    // replaced it.
    static std::shared_ptr<UrlOpener> sharedOpener();
    using Maker = std::shared_ptr<UrlOpener>();
    static Implementation<Maker>& implementation();
};

} // namespace platform
