#pragma once

#include "platform/runtime/Error.h"

#include <QString>

namespace platform {

// The failures a publishing service reports, in the domain
// PublishingError::domain(). The message says what happened in words a user
// can act on; the log and the form show it as it is.
namespace PublishingError {

enum Code {
    NotConfigured = 1,     // no OAuth client is set up for this installation
    NotSignedIn = 2,       // no account, and signing in was not asked for
    SignInCancelled = 3,   // the user refused, or closed the browser and gave up
    SignInFailed = 4,      // the sign-in service refused or did not answer
    Unauthorized = 5,      // the account's authorisation was revoked or is not enough
    QuotaExceeded = 6,     // the API's daily quota or the account's upload limit
    Forbidden = 7,         // another refusal of the request (a 4xx answer)
    ServerUnavailable = 8, // 5xx answers or dropped connections, after every retry
    BadResponse = 9,       // an answer the protocol does not allow
    MediaNotReady = 10,    // the file to publish never became complete
    MediaUnreadable = 11,  // the file to publish cannot be read
    Cancelled = 12,        // the upload was cancelled
};

QString domain(); // "TamselPublishing"

ErrorPtr make(Code code, const QString& message);

// Whether `error` is of this domain with `code`.
bool is(const ErrorPtr& error, Code code);

} // namespace PublishingError
} // namespace platform
