#pragma once

#include "platform/runtime/Error.h"

#include <QByteArray>

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
    // The "reason" of the service's error document ("quotaExceeded"), or "".
    static QString reasonOf(const QByteArray& body);
};

} // namespace youtube_publishing
