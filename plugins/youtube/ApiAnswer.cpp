#include "ApiAnswer.h"

#include "platform/publishing/PublishingError.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QNetworkReply>
#include <QRegularExpression>

namespace youtube_publishing {

namespace PublishingError = platform::PublishingError;

namespace {

QString messageOf(const QByteArray& body) {
    return QJsonDocument::fromJson(body)
        .object()
        .value(QLatin1String("error"))
        .toObject()
        .value(QLatin1String("message"))
        .toString();
}

} // namespace

QString ApiAnswer::reasonOf(const QByteArray& body) {
    const QJsonObject error =
        QJsonDocument::fromJson(body).object().value(QLatin1String("error")).toObject();
    const QJsonArray errors = error.value(QLatin1String("errors")).toArray();
    if (!errors.isEmpty())
        return errors.first().toObject().value(QLatin1String("reason")).toString();
    return error.value(QLatin1String("status")).toString();
}

QList<platform::YouTubeVideoCategory> ApiAnswer::categoriesOf(const QByteArray& body) {
    QList<platform::YouTubeVideoCategory> categories;
    const QJsonArray items =
        QJsonDocument::fromJson(body).object().value(QLatin1String("items")).toArray();
    for (const QJsonValue& item : items) {
        const QJsonObject snippet = item.toObject().value(QLatin1String("snippet")).toObject();
        // Only assignable categories can hold a new video.
        if (snippet.value(QLatin1String("assignable")).toBool())
            categories.append({item.toObject().value(QLatin1String("id")).toString(),
                               snippet.value(QLatin1String("title")).toString()});
    }
    return categories;
}

QString ApiAnswer::videoIdOf(const QByteArray& body) {
    return QJsonDocument::fromJson(body).object().value(QLatin1String("id")).toString();
}

qint64 ApiAnswer::heldBytesOf(const QByteArray& rangeHeader) {
    static const QRegularExpression range(QStringLiteral("^bytes=0-(\\d{1,18})$"));
    const auto match = range.match(QString::fromLatin1(rangeHeader).trimmed());
    return match.hasMatch() ? match.captured(1).toLongLong() + 1 : 0;
}

ApiAnswer ApiAnswer::of(QNetworkReply* reply) {
    return classify(reply->attribute(QNetworkRequest::HttpStatusCodeAttribute).toInt(),
                    reply->readAll(), reply->errorString());
}

ApiAnswer ApiAnswer::classify(int status, QByteArray body, const QString& transportError) {
    ApiAnswer answer;
    answer.status = status;
    answer.body = std::move(body);
    if (answer.status == 0) {
        // No answer at all: refused, dropped, timed out. The server may have
        // kept part of what was sent; asking it tells.
        answer.kind = Kind::Retry;
        answer.error = PublishingError::make(
            PublishingError::ServerUnavailable,
            QStringLiteral("YouTube could not be reached: %1").arg(transportError));
        return answer;
    }
    const QString reason = reasonOf(answer.body);
    const QString message = messageOf(answer.body);
    auto described = [&](const QString& what) {
        return message.isEmpty() ? what : QStringLiteral("%1 (%2)").arg(what, message);
    };
    switch (answer.status) {
    case 200:
    case 201:
        answer.kind = Kind::Success;
        return answer;
    case 308:
        answer.kind = Kind::Incomplete;
        return answer;
    case 401:
        answer.kind = Kind::RenewToken;
        answer.error = PublishingError::make(
            PublishingError::Unauthorized,
            described(QStringLiteral("YouTube did not accept the account's authorisation")));
        return answer;
    case 404:
    case 410:
        answer.kind = Kind::SessionGone;
        answer.error =
            PublishingError::make(PublishingError::BadResponse,
                                  described(QStringLiteral("YouTube no longer knows the upload")));
        return answer;
    case 429:
        answer.kind = Kind::Retry;
        answer.error =
            PublishingError::make(PublishingError::ServerUnavailable,
                                  described(QStringLiteral("YouTube asked to slow down")));
        return answer;
    case 403:
        if (reason == QLatin1String("rateLimitExceeded") ||
            reason == QLatin1String("userRateLimitExceeded")) {
            answer.kind = Kind::Retry;
            answer.error =
                PublishingError::make(PublishingError::ServerUnavailable,
                                      described(QStringLiteral("YouTube asked to slow down")));
        } else if (reason == QLatin1String("quotaExceeded") ||
                   reason == QLatin1String("dailyLimitExceeded") ||
                   reason == QLatin1String("uploadLimitExceeded")) {
            answer.error = PublishingError::make(
                PublishingError::QuotaExceeded,
                QStringLiteral("YouTube's upload quota is used up for today; try again "
                               "tomorrow"));
        } else if (reason == QLatin1String("insufficientPermissions") ||
                   reason == QLatin1String("forbidden") ||
                   reason == QLatin1String("youtubeSignupRequired")) {
            answer.error = PublishingError::make(
                PublishingError::Unauthorized,
                described(QStringLiteral("The account may not upload to YouTube")));
        } else {
            answer.error =
                PublishingError::make(PublishingError::Forbidden,
                                      described(QStringLiteral("YouTube refused the upload")));
        }
        return answer;
    default:
        break;
    }
    if (answer.status >= 500) {
        answer.kind = Kind::Retry;
        answer.error = PublishingError::make(
            PublishingError::ServerUnavailable,
            described(QStringLiteral("YouTube is not available (HTTP %1)").arg(answer.status)));
        return answer;
    }
    answer.error = PublishingError::make(
        PublishingError::Forbidden,
        described(QStringLiteral("YouTube refused the request (HTTP %1)").arg(answer.status)));
    return answer;
}

} // namespace youtube_publishing
