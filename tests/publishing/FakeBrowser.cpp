#include "FakeBrowser.h"

#include <QNetworkAccessManager>
#include <QNetworkReply>

namespace testing_support {

FakeBrowser::FakeBrowser(Behaviour behaviour)
    : behaviour_(behaviour), network_(new QNetworkAccessManager) {}

FakeBrowser::~FakeBrowser() {
    delete network_;
}

bool FakeBrowser::openURL(const QUrl& url) {
    opened_ << url;
    if (behaviour_ == Behaviour::Refuse)
        return false;
    if (behaviour_ == Behaviour::Ignore)
        return true;
    QNetworkRequest request(url);
    request.setAttribute(QNetworkRequest::RedirectPolicyAttribute,
                         QNetworkRequest::NoLessSafeRedirectPolicy);
    QNetworkReply* reply = network_->get(request);
    QObject::connect(reply, &QNetworkReply::finished, reply, [this, reply] {
        lastPage_ = reply->readAll();
        reply->deleteLater();
    });
    return true;
}

ScopedBrowser::ScopedBrowser(FakeBrowser::Behaviour behaviour)
    : browser_(std::make_shared<FakeBrowser>(behaviour)),
      replacement_(platform::UrlOpener::implementation().replace([browser = browser_] {
          return std::static_pointer_cast<platform::UrlOpener>(browser);
      })) {}

} // namespace testing_support
