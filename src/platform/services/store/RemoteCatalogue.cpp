#include "RemoteCatalogue.h"

#include "platform/runtime/Log.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QNetworkAccessManager>
#include <QNetworkReply>
#include <QNetworkRequest>

namespace platform {

namespace {

QUrl under(const QUrl& base, const QString& path) {
    QUrl url = base;
    QString joined = url.path();
    if (!joined.endsWith(QLatin1Char('/')))
        joined += QLatin1Char('/');
    url.setPath(joined + path);
    return url;
}

// Identifiers go into the path; anything that is not a reverse-DNS name
// would change which resource is asked for.
bool isPlainIdentifier(const QString& id) {
    if (id.isEmpty() || id.size() > 255)
        return false;
    for (const QChar c : id)
        if (!(c.isLetterOrNumber() && c.unicode() < 128) && c != QLatin1Char('.') &&
            c != QLatin1Char('-') && c != QLatin1Char('_'))
            return false;
    return true;
}

QString developerOf(const QJsonObject& app) {
    const QString plain = app.value(QLatin1String("developer_name")).toString();
    if (!plain.isEmpty())
        return plain;
    // Newer catalogues describe the developer as an object.
    const QJsonValue developer = app.value(QLatin1String("developer"));
    if (developer.isObject())
        return developer.toObject().value(QLatin1String("name")).toString();
    return developer.toString();
}

} // namespace

RemoteCatalogue::RemoteCatalogue(QUrl base, std::chrono::milliseconds timeout)
    : base_(std::move(base)), timeout_(timeout) {}

RemoteCatalogue::~RemoteCatalogue() = default;

QUrl RemoteCatalogue::defaultBase() {
    const QString configured = qEnvironmentVariable("TAMSEL_STORE_URL");
    return configured.isEmpty() ? QUrl(QStringLiteral("https://flathub.org")) : QUrl(configured);
}

bool RemoteCatalogue::isEnabled() {
    return !qEnvironmentVariableIsSet("TAMSEL_STORE_URL") ||
           !qEnvironmentVariable("TAMSEL_STORE_URL").isEmpty();
}

std::optional<StoreRecord> RemoteCatalogue::parseAnswer(const QByteArray& body, const QUrl& base,
                                                        const QString& id, QString* why) {
    QJsonParseError error{};
    const QJsonDocument document = QJsonDocument::fromJson(body, &error);
    if (error.error != QJsonParseError::NoError || !document.isObject()) {
        if (why)
            *why = error.error != QJsonParseError::NoError ? error.errorString()
                                                           : QStringLiteral("not an object");
        return std::nullopt;
    }
    const QJsonObject app = document.object();
    StoreRecord record;
    record.name = app.value(QLatin1String("name")).toString();
    if (record.name.isEmpty()) {
        if (why)
            *why = QStringLiteral("no name");
        return std::nullopt;
    }
    record.developerName = developerOf(app);
    for (const QJsonValue& category : app.value(QLatin1String("categories")).toArray())
        if (category.isString() && !category.toString().isEmpty())
            record.categories.append(category.toString());
    record.storeLink = under(base, QStringLiteral("apps/") + id).toString();
    return record;
}

void RemoteCatalogue::lookupApplication(const QString& bundleIdentifier, Done done) {
    if (!isPlainIdentifier(bundleIdentifier)) {
        done(std::nullopt);
        return;
    }
    if (!network_)
        network_ = std::make_unique<QNetworkAccessManager>();
    QNetworkRequest request(under(base_, QStringLiteral("api/v2/appstream/") + bundleIdentifier));
    request.setRawHeader("Accept", "application/json");
    request.setTransferTimeout(int(timeout_.count()));
    QNetworkReply* reply = network_->get(request);
    const QUrl base = base_;
    QObject::connect(reply, &QNetworkReply::finished, reply,
                     [reply, base, bundleIdentifier, done = std::move(done)] {
                         reply->deleteLater();
                         const int status =
                             reply->attribute(QNetworkRequest::HttpStatusCodeAttribute).toInt();
                         if (status == 404) {
                             done(std::nullopt);
                             return;
                         }
                         if (reply->error() != QNetworkReply::NoError) {
                             logError(QStringLiteral("RemoteCatalogue: %1: %2")
                                          .arg(bundleIdentifier, reply->errorString()));
                             done(std::nullopt);
                             return;
                         }
                         const QByteArray body = reply->readAll();
                         // The catalogue answers JSON null for an application it does not
                         // know.
                         if (body.trimmed() == "null") {
                             done(std::nullopt);
                             return;
                         }
                         QString why;
                         auto record = parseAnswer(body, base, bundleIdentifier, &why);
                         if (!record)
                             logError(QStringLiteral("RemoteCatalogue: %1: unusable answer (%2)")
                                          .arg(bundleIdentifier, why));
                         done(std::move(record));
                     });
}

} // namespace platform
