#include "PortalRequest.h"

#include <QRandomGenerator>
#include <QTimer>

namespace platform {

PortalRequest::PortalRequest(QDBusConnection bus, Done done, int timeoutMs)
    : bus_(std::move(bus)), done_(std::move(done)) {
    token_ = QStringLiteral("tamsel%1").arg(QRandomGenerator::global()->generate());
    QString sender = bus_.baseService();
    sender.remove(0, sender.startsWith(QLatin1Char(':')) ? 1 : 0);
    sender.replace(QLatin1Char('.'), QLatin1Char('_'));
    path_ = QStringLiteral("/org/freedesktop/portal/desktop/request/%1/%2").arg(sender, token_);
    bus_.connect(QString(), path_, QStringLiteral("org.freedesktop.portal.Request"),
                 QStringLiteral("Response"), this, SLOT(response(uint, QVariantMap)));
    QTimer::singleShot(timeoutMs, this, [this] { response(2, {}); });
}

void PortalRequest::fail() {
    response(2, {});
}

void PortalRequest::response(uint response, const QVariantMap& results) {
    if (!done_)
        return;
    bus_.disconnect(QString(), path_, QStringLiteral("org.freedesktop.portal.Request"),
                    QStringLiteral("Response"), this, SLOT(response(uint, QVariantMap)));
    auto done = std::exchange(done_, {});
    deleteLater();
    done(response, results);
}

} // namespace platform
