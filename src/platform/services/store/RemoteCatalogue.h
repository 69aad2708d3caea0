#pragma once

#include "platform/services/store/StoreCatalogue.h"

#include <QUrl>

#include <chrono>
#include <memory>

class QNetworkAccessManager;

namespace platform {

// A catalogue on the web that speaks Flathub's public API: the details of an
// application are the JSON object at "<base>/api/v2/appstream/<id>" (its
// "name", "developer_name" and "categories"), and its web page,
// "<base>/apps/<id>", is the store link, which people on any system can
// open.
//
// The base is $TAMSEL_STORE_URL when it is set, else Flathub's. A request
// that has not finished after `timeout` is abandoned; an answer that is not
// such an object (an error page, garbage, JSON null) counts as not found and
// is logged.
//
// Lives on the store service's thread: make it, use it and let it go there
// (its network access is made on the first lookup).
class RemoteCatalogue final : public StoreCatalogue {
  public:
    explicit RemoteCatalogue(QUrl base = defaultBase(),
                             std::chrono::milliseconds timeout = std::chrono::milliseconds(2500));
    ~RemoteCatalogue() override;

    void lookupApplication(const QString& bundleIdentifier, Done done) override;

    // $TAMSEL_STORE_URL, else Flathub.
    static QUrl defaultBase();
    // False when $TAMSEL_STORE_URL is set but empty: the user wants no
    // remote catalogue asked.
    static bool isEnabled();

    // The record in an answer's body; nullopt when it holds none. `id` gives
    // the store link. Any thread.
    static std::optional<StoreRecord> parseAnswer(const QByteArray& body, const QUrl& base,
                                                  const QString& id, QString* why);

  private:
    QUrl base_;
    std::chrono::milliseconds timeout_;
    std::unique_ptr<QNetworkAccessManager> network_;
};

} // namespace platform
