#pragma once

#include "platform/publishing/YouTubeUploadClient.h"
#include "platform/runtime/Error.h"

#include <QByteArray>
#include <QList>

class QNetworkReply;

namespace youtube_publishing {

// What an answer of the YouTube Data API means for the request that got it.
struct ApiAnswer {
    enum class Kind {
        Success,     // 200 or 201
        Incomplete,  // 308: a resumable upload goes on
        Retry,       // dropped connection, timeout, 5xx, 429, rate limits: wait and ask again
        RenewToken,  // 401: the access token is no longer good
        SessionGone, // 404 or 410 on an upload session: it has to start again
        Fail,        // a refusal that asking again will not change
    };
    Kind kind = Kind::Fail;
    int status = 0; // HTTP status; 0 when no answer came
    QByteArray body;
    platform::ErrorPtr error; // why, for Retry, RenewToken, SessionGone and Fail

    // Reads a finished reply (its body too).
    static ApiAnswer of(QNetworkReply* reply);
    // What an answer with this status and body means; status 0 is no answer
    // at all, for the reason `transportError` gives.
    static ApiAnswer classify(int status, QByteArray body, const QString& transportError);
    // The "reason" of the service's error document ("quotaExceeded"), or "".
    static QString reasonOf(const QByteArray& body);

    // The parts of the service's answers the plug-in reads; whatever a body
    // or header holds, each gives a plain result, never fails.
    // The assignable categories of a videoCategories list.
    static QList<platform::YouTubeVideoCategory> categoriesOf(const QByteArray& body);
    // The id of the video a finished upload made, or "".
    static QString videoIdOf(const QByteArray& body);
    // From a 308's "Range: bytes=0-N": the N + 1 bytes the server holds; 0
    // without such a header.
    static qint64 heldBytesOf(const QByteArray& rangeHeader);
};

} // namespace youtube_publishing
