#include "LoopbackReplyHandler.h"

#include "platform/publishing/PublishingError.h"

#include <QJsonDocument>
#include <QJsonObject>
#include <QNetworkReply>

namespace youtube_publishing {

namespace PublishingError = platform::PublishingError;

LoopbackReplyHandler::LoopbackReplyHandler(QObject* parent)
    : QOAuthHttpServerReplyHandler(QHostAddress::LocalHost, 0, parent) {
    setCallbackText(QStringLiteral(
        "<!DOCTYPE html><html><head><meta charset=\"utf-8\"><title>Tamsel</title></head>"
        "<body style=\"font-family:sans-serif;text-align:center;margin-top:4em\">"
        "<h1>Tamsel has your answer</h1>"
        "<p>You can close this tab and go back to the editor.</p></body></html>"));
}

QString LoopbackReplyHandler::callback() const {
    return QStringLiteral("http://127.0.0.1:%1/").arg(port());
}

void LoopbackReplyHandler::networkReplyFinished(QNetworkReply* reply) {
    const int status = reply->attribute(QNetworkRequest::HttpStatusCodeAttribute).toInt();
    if (reply->error() == QNetworkReply::NoError && status < 400) {
        if (!reply->header(QNetworkRequest::ContentTypeHeader).isNull()) {
            QOAuthHttpServerReplyHandler::networkReplyFinished(reply);
            return;
        }
        // Qt would drop an answer without a type and keep the sign-in waiting.
        emit tokenRequestFailed(PublishingError::make(
            PublishingError::SignInFailed, QStringLiteral("Google's sign-in answered oddly")));
        return;
    }
    const QJsonObject answer = QJsonDocument::fromJson(reply->readAll()).object();
    const QString error = answer.value(QLatin1String("error")).toString();
    const QString description = answer.value(QLatin1String("error_description")).toString();
    QString message =
        status == 0
            ? QStringLiteral("Google's sign-in could not be reached: %1").arg(reply->errorString())
            : QStringLiteral("Google's sign-in refused: %1").arg(error);
    if (!description.isEmpty())
        message += QStringLiteral(" (%1)").arg(description);
    emit tokenRequestFailed(PublishingError::make(PublishingError::SignInFailed, message));
}

} // namespace youtube_publishing
