#pragma once

#include <QDBusConnection>
#include <QObject>
#include <QVariantMap>

#include <functional>

namespace platform {

// One portal request: listens for the Response signal on the request object
// that a portal call will create, and reports it once. Deletes itself after
// reporting, or after `timeoutMs` with response 2 (failed). Main thread.
class PortalRequest : public QObject {
    Q_OBJECT
  public:
    using Done = std::function<void(uint response, const QVariantMap& results)>;

    // Subscribes before the call is made, as the portal documentation asks,
    // so an early answer is not missed. handleToken() goes into the call's
    // options.
    PortalRequest(QDBusConnection bus, Done done, int timeoutMs);
    QString handleToken() const { return token_; }
    // The call failed: report 2 now.
    void fail();

  private slots:
    void response(uint response, const QVariantMap& results);

  private:
    QDBusConnection bus_;
    Done done_;
    QString token_;
    QString path_;
};

} // namespace platform
