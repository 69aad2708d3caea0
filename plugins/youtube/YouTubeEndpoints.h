#pragma once

#include <QString>
#include <QUrl>

namespace youtube_publishing {

// Where the plug-in signs in and sends its requests. The service's own
// addresses, unless the environment points them elsewhere (tests point them
// at a local server):
//   TAMSEL_YOUTUBE_SIGNIN_URL  base of the sign-in page and token endpoint
//                              (<base>/o/oauth2/v2/auth, <base>/token)
//   TAMSEL_YOUTUBE_API_URL     base of the Data API (<base>/youtube/v3/...,
//                              <base>/upload/youtube/v3/...)
// Read anew on every call. Thread-safe.
struct Endpoints {
    QUrl authorization;
    QUrl token;
    QUrl videoCategories;
    QUrl uploadVideos;

    static Endpoints current();
    // The web address of a published video.
    static QUrl watchURL(const QString& videoId);
    // The only scope asked for: uploading videos, nothing else.
    static QString uploadScope();
};

// The OAuth client this installation signs in as: a "Desktop app" client of
// a Google Cloud project with the YouTube Data API enabled. Looked up in
// order: TAMSEL_YOUTUBE_CLIENT_ID and TAMSEL_YOUTUBE_CLIENT_SECRET in the
// environment; the "[oauth]" group's client_id and client_secret of
// "tamsel/youtube.conf" in the user's or the system's configuration folders
// ($XDG_CONFIG_HOME, $XDG_CONFIG_DIRS); what the build was configured with.
// Thread-safe.
struct OAuthClient {
    QString identifier;
    QString secret;

    bool isConfigured() const { return !identifier.isEmpty(); }
    static OAuthClient configured();
};

} // namespace youtube_publishing
