#pragma once

#include "platform/ui/UrlOpener.h"

#include <QList>
#include <QUrl>

class QNetworkAccessManager;

namespace testing_support {

// Stands in for the user's browser while a test replaces the desktop's URL
// opener with it: it records every address it is asked to open and, when
// `follows` is true, loads it and follows the redirects, as a browser does
// once the user has agreed on the consent page (the fake service's page
// agrees at once). The page the redirect ends on is kept.
class FakeBrowser : public platform::UrlOpener {
  public:
    enum class Behaviour { Follow, Ignore, Refuse };
    explicit FakeBrowser(Behaviour behaviour = Behaviour::Follow);
    ~FakeBrowser() override;

    bool openURL(const QUrl& url) override;

    QList<QUrl> opened() const { return opened_; }
    // The body of the last page the browser ended on.
    QByteArray lastPage() const { return lastPage_; }

  private:
    Behaviour behaviour_;
    QNetworkAccessManager* network_;
    QList<QUrl> opened_;
    QByteArray lastPage_;
};

// Makes a FakeBrowser the URL opener for its lifetime.
class ScopedBrowser {
  public:
    explicit ScopedBrowser(FakeBrowser::Behaviour behaviour = FakeBrowser::Behaviour::Follow);
    FakeBrowser& browser() { return *browser_; }

  private:
    std::shared_ptr<FakeBrowser> browser_;
    platform::Implementation<platform::UrlOpener::Maker>::Replacement replacement_;
};

} // namespace testing_support
