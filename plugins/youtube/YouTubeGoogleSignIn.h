#pragma once

#include "YouTubeEndpoints.h"

#include "platform/publishing/YouTubeSignIn.h"

#include <QPointer>
#include <QTimer>

class QNetworkAccessManager;
class QOAuth2AuthorizationCodeFlow;

namespace youtube_publishing {
class LoopbackReplyHandler;
}

// Signs in to Google the way Google asks of desktop applications: OAuth 2.0
// in the user's browser (opened with the desktop's URL opener), the answer
// redirected to a loopback address, the code bound to this sign-in with PKCE
// (S256), and the scope limited to uploading videos. The refresh token is
// kept by youtube_publishing::RefreshTokenStore; access tokens are shared by
// every sign-in of the process until they expire.
//
// Registered with the class registry by the plug-in; main thread only (see
// platform::YouTubeSignIn for the contract).
class YouTubeGoogleSignIn : public platform::YouTubeSignIn {
    Q_OBJECT
  public:
    Q_INVOKABLE YouTubeGoogleSignIn();
    ~YouTubeGoogleSignIn() override;

    void restore(Handler handler) override;
    bool isSignedIn() const override { return signedIn_; }
    bool isConfigured() const override { return client_.isConfigured(); }
    void signIn(Handler handler) override;
    void accessToken(bool renew, TokenHandler handler) override;
    void signOut() override;

    // How long a sign-in waits for the browser's answer (five minutes).
    void setSignInTimeout(int milliseconds) { signInTimeoutMs_ = milliseconds; }

  private:
    void finishSignIn(const platform::ErrorPtr& error);
    void refresh(const QString& refreshToken);
    void finishRefresh(const QString& accessToken, const platform::ErrorPtr& error);
    void setSignedIn(bool signedIn);

    youtube_publishing::OAuthClient client_;
    QNetworkAccessManager* network_;
    QPointer<QOAuth2AuthorizationCodeFlow> flow_;
    QPointer<youtube_publishing::LoopbackReplyHandler> loopback_;
    QByteArray verifier_;
    QTimer signInTimer_;
    int signInTimeoutMs_ = 5 * 60 * 1000;
    QList<Handler> signInWaiting_;
    QList<TokenHandler> tokenWaiting_;
    bool refreshing_ = false;
    bool signedIn_ = false;
};
