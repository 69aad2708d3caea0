#include "YouTubeEndpoints.h"

#include <QSettings>
#include <QStandardPaths>

#ifndef TAMSEL_YOUTUBE_CLIENT_ID
#define TAMSEL_YOUTUBE_CLIENT_ID ""
#endif
#ifndef TAMSEL_YOUTUBE_CLIENT_SECRET
#define TAMSEL_YOUTUBE_CLIENT_SECRET ""
#endif

namespace youtube_publishing {

namespace {

QString baseFromEnvironment(const char* name, const QString& fallback) {
    QString base = qEnvironmentVariable(name);
    if (base.isEmpty())
        return fallback;
    while (base.endsWith(QLatin1Char('/')))
        base.chop(1);
    return base;
}

} // namespace

Endpoints Endpoints::current() {
    const QString signIn = baseFromEnvironment("TAMSEL_YOUTUBE_SIGNIN_URL", QString());
    const QString api =
        baseFromEnvironment("TAMSEL_YOUTUBE_API_URL", QStringLiteral("https://www.googleapis.com"));
    Endpoints endpoints;
    endpoints.authorization =
        QUrl((signIn.isEmpty() ? QStringLiteral("https://accounts.google.com") : signIn) +
             QStringLiteral("/o/oauth2/v2/auth"));
    endpoints.token =
        QUrl((signIn.isEmpty() ? QStringLiteral("https://oauth2.googleapis.com") : signIn) +
             QStringLiteral("/token"));
    endpoints.videoCategories = QUrl(api + QStringLiteral("/youtube/v3/videoCategories"));
    endpoints.uploadVideos = QUrl(api + QStringLiteral("/upload/youtube/v3/videos"));
    return endpoints;
}

QUrl Endpoints::watchURL(const QString& videoId) {
    QUrl url(QStringLiteral("https://www.youtube.com/watch"));
    url.setQuery(QStringLiteral("v=") + videoId);
    return url;
}

QString Endpoints::uploadScope() {
    return QStringLiteral("https://www.googleapis.com/auth/youtube.upload");
}

OAuthClient OAuthClient::configured() {
    OAuthClient client{qEnvironmentVariable("TAMSEL_YOUTUBE_CLIENT_ID"),
                       qEnvironmentVariable("TAMSEL_YOUTUBE_CLIENT_SECRET")};
    if (client.isConfigured())
        return client;
    const QString file = QStandardPaths::locate(QStandardPaths::GenericConfigLocation,
                                                QStringLiteral("tamsel/youtube.conf"));
    if (!file.isEmpty()) {
        const QSettings settings(file, QSettings::IniFormat);
        client = {settings.value(QStringLiteral("oauth/client_id")).toString().trimmed(),
                  settings.value(QStringLiteral("oauth/client_secret")).toString().trimmed()};
        if (client.isConfigured())
            return client;
    }
    return {QStringLiteral(TAMSEL_YOUTUBE_CLIENT_ID), QStringLiteral(TAMSEL_YOUTUBE_CLIENT_SECRET)};
}

} // namespace youtube_publishing
