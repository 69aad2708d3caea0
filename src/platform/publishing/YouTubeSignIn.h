#pragma once

#include "platform/runtime/Error.h"
#include "platform/runtime/Implementation.h"

#include <QObject>
#include <QString>

#include <functional>
#include <memory>

namespace platform {

// Signs the user in to the Google account they publish with, and hands out
// access tokens for the YouTube Data API whose scope is limited to uploading.
//
// The real implementation comes with the YouTube publishing plug-in, which
// registers its class under realClassName() when it is loaded: make() gives
// null before that, unless a test put another maker in its place.
//
// Main thread only. Every handler is called once, later, on the main thread
// (never inside the call that was given it), unless the sign-in is destroyed
// first. Failures are PublishingError values.
class YouTubeSignIn : public QObject {
    Q_OBJECT
  public:
    using Handler = std::function<void(ErrorPtr error)>;
    using TokenHandler = std::function<void(const QString& accessToken, ErrorPtr error)>;

    ~YouTubeSignIn() override = default;

    // Looks for the account of an earlier sign-in: in the desktop's secret
    // store, or in this process's memory where no secret store runs. Null
    // when there is one, NotSignedIn when there is none.
    virtual void restore(Handler handler) = 0;
    // Whether an account is known (after restore or signIn).
    virtual bool isSignedIn() const = 0;
    // Whether signing in can work at all here (an OAuth client is set up).
    virtual bool isConfigured() const { return true; }

    // Opens the sign-in page in the user's browser and waits for its answer
    // on a loopback address. The account is then kept for later sessions.
    // SignInCancelled when the user refuses or gives up (a sign-in that is
    // not answered in time), SignInFailed when the service refuses,
    // NotConfigured without an OAuth client. A second call while one runs
    // joins it.
    virtual void signIn(Handler handler) = 0;

    // An access token for the next request: the current one while it stays
    // valid for a while yet; otherwise, or with `renew` (a server has just
    // refused the current one), a new one got with the account's refresh
    // token. NotSignedIn without an account; Unauthorized when the service no
    // longer accepts the account (it is then forgotten); SignInFailed when the
    // service cannot be reached.
    virtual void accessToken(bool renew, TokenHandler handler) = 0;

    // Forgets the account, in memory and in the secret store.
    virtual void signOut() = 0;

    // The name under which the plug-in registers its implementation.
    static QString realClassName(); // "YouTubeGoogleSignIn"

    // A sign-in from implementation(): the plug-in's class, unless a test
    // replaced the maker; null when no plug-in has registered one.
    static std::shared_ptr<YouTubeSignIn> make();
    using Maker = std::shared_ptr<YouTubeSignIn>();
    static Implementation<Maker>& implementation();

  signals:
    void signedInChanged(bool signedIn);

  protected:
    YouTubeSignIn() = default;
};

} // namespace platform
