#include "UrlOpener.h"

#include "platform/runtime/Log.h"

#include <QDesktopServices>

namespace platform {

namespace {

class DesktopUrlOpener final : public UrlOpener {
  public:
    bool openURL(const QUrl& url) override {
        if (!url.isValid() || url.scheme().isEmpty()) {
            logError(QStringLiteral("UrlOpener: not an address: %1").arg(url.toString()));
            return false;
        }
        return QDesktopServices::openUrl(url);
    }
};

} // namespace

Implementation<UrlOpener::Maker>& UrlOpener::implementation() {
    static Implementation<Maker> chosen([]() -> std::shared_ptr<UrlOpener> {
        static const auto desktop = std::make_shared<DesktopUrlOpener>();
        return desktop;
    });
    return chosen;
}

std::shared_ptr<UrlOpener> UrlOpener::sharedOpener() {
    return implementation().make();
}

} // namespace platform
