#include "YouTubeGoogleSignIn.h"

#include "LoopbackReplyHandler.h"
#include "RefreshTokenStore.h"

#include "platform/publishing/PublishingError.h"
#include "platform/runtime/Log.h"
#include "platform/runtime/MainQueue.h"
#include "platform/ui/UrlOpener.h"

#include <QCryptographicHash>
#include <QDateTime>
#include <QHash>
#include <QJsonDocument>
#include <QJsonObject>
#include <QNetworkAccessManager>
#include <QNetworkReply>
#include <QOAuth2AuthorizationCodeFlow>
#include <QRandomGenerator>
#include <QUrlQuery>

using platform::ErrorPtr;
using youtube_publishing::Endpoints;
using youtube_publishing::RefreshTokenStore;
namespace PublishingError = platform::PublishingError;

namespace {

// A token is handed out only while it has this long to live, so a request
// made with it does not meet its expiry on the way.
constexpr int kTokenMarginSeconds = 60;

struct AccessToken {
    QString token;
    QDateTime expiry;
};

// Access tokens of the process, by OAuth client.
QHash<QString, AccessToken>& accessTokens() {
    static QHash<QString, AccessToken> tokens;
    return tokens;
}

QByteArray randomUrlSafe(int bytes) {
    QByteArray random(bytes, Qt::Uninitialized);
    QRandomGenerator::system()->generate(random.begin(), random.end());
    return random.toBase64(QByteArray::Base64UrlEncoding | QByteArray::OmitTrailingEquals);
}

ErrorPtr notSignedIn() {
    return PublishingError::make(PublishingError::NotSignedIn,
                                 QStringLiteral("Not signed in to YouTube"));
}

} // namespace

YouTubeGoogleSignIn::YouTubeGoogleSignIn()
    : client_(youtube_publishing::OAuthClient::configured()),
      network_(new QNetworkAccessManager(this)) {
    signInTimer_.setSingleShot(true);
    connect(&signInTimer_, &QTimer::timeout, this, [this] {
        finishSignIn(PublishingError::make(PublishingError::SignInCancelled,
                                           QStringLiteral("The browser gave no answer")));
    });
}

YouTubeGoogleSignIn::~YouTubeGoogleSignIn() = default;

void YouTubeGoogleSignIn::setSignedIn(bool signedIn) {
    if (signedIn_ == signedIn)
        return;
    signedIn_ = signedIn;
    emit signedInChanged(signedIn);
}

void YouTubeGoogleSignIn::restore(Handler handler) {
    QPointer<YouTubeGoogleSignIn> self(this);
    RefreshTokenStore::shared().load(client_.identifier, [self, handler](const QString& token) {
        if (!self)
            return;
        const bool known =
            !token.isEmpty() || !accessTokens().value(self->client_.identifier).token.isEmpty();
        self->setSignedIn(known);
        handler(known ? nullptr : notSignedIn());
    });
}

void YouTubeGoogleSignIn::signIn(Handler handler) {
    if (!client_.isConfigured()) {
        platform::MainQueue::async([handler] {
            handler(PublishingError::make(
                PublishingError::NotConfigured,
                QStringLiteral("YouTube publishing is not set up: no OAuth client is configured")));
        });
        return;
    }
    signInWaiting_ << std::move(handler);
    if (flow_)
        return; // joins the sign-in under way
    const Endpoints endpoints = Endpoints::current();
    loopback_ = new youtube_publishing::LoopbackReplyHandler(this);
    flow_ = new QOAuth2AuthorizationCodeFlow(network_, this);
    flow_->setAuthorizationUrl(endpoints.authorization);
    flow_->setAccessTokenUrl(endpoints.token);
    flow_->setClientIdentifier(client_.identifier);
    flow_->setClientIdentifierSharedKey(client_.secret);
    flow_->setScope(Endpoints::uploadScope());
    flow_->setState(QString::fromLatin1(randomUrlSafe(16)));
    flow_->setReplyHandler(loopback_);
    if (!loopback_->isListening()) {
        platform::MainQueue::async([self = QPointer(this)] {
            if (self)
                self->finishSignIn(PublishingError::make(
                    PublishingError::SignInFailed,
                    QStringLiteral("No loopback port is free for the sign-in")));
        });
        return;
    }

    // PKCE: Qt Network Authorization 6.4 has no support of its own, so the
    // challenge and the verifier go in through its parameter hook.
    verifier_ = randomUrlSafe(48);
    const QByteArray challenge =
        QCryptographicHash::hash(verifier_, QCryptographicHash::Sha256)
            .toBase64(QByteArray::Base64UrlEncoding | QByteArray::OmitTrailingEquals);
    const QByteArray verifier = verifier_;
    flow_->setModifyParametersFunction(
        [challenge, verifier](QAbstractOAuth::Stage stage,
                              QMultiMap<QString, QVariant>* parameters) {
            if (stage == QAbstractOAuth::Stage::RequestingAuthorization) {
                parameters->insert(QStringLiteral("code_challenge"), challenge);
                parameters->insert(QStringLiteral("code_challenge_method"), QStringLiteral("S256"));
            } else if (stage == QAbstractOAuth::Stage::RequestingAccessToken) {
                parameters->insert(QStringLiteral("code_verifier"), verifier);
            }
        });

    connect(flow_, &QAbstractOAuth::authorizeWithBrowser, this, [this](const QUrl& url) {
        if (!platform::UrlOpener::sharedOpener()->openURL(url))
            finishSignIn(PublishingError::make(PublishingError::SignInFailed,
                                               QStringLiteral("No web browser could be opened")));
    });
    connect(flow_, &QAbstractOAuth::granted, this, [this] {
        const QString refreshToken = flow_->refreshToken();
        if (!refreshToken.isEmpty())
            RefreshTokenStore::shared().save(client_.identifier, refreshToken);
        accessTokens().insert(client_.identifier, {flow_->token(), flow_->expirationAt()});
        finishSignIn(nullptr);
    });
    connect(flow_, &QAbstractOAuth2::error, this,
            [this](const QString& error, const QString& description, const QUrl&) {
                const bool refused = error == QLatin1String("access_denied");
                QString message = refused
                                      ? QStringLiteral("Signing in was cancelled")
                                      : QStringLiteral("Google's sign-in refused: %1").arg(error);
                if (!description.isEmpty())
                    message += QStringLiteral(" (%1)").arg(description);
                finishSignIn(PublishingError::make(refused ? PublishingError::SignInCancelled
                                                           : PublishingError::SignInFailed,
                                                   message));
            });
    connect(flow_, &QAbstractOAuth::requestFailed, this, [this](QAbstractOAuth::Error) {
        finishSignIn(PublishingError::make(PublishingError::SignInFailed,
                                           QStringLiteral("Google's sign-in failed")));
    });
    connect(loopback_, &youtube_publishing::LoopbackReplyHandler::tokenRequestFailed, this,
            &YouTubeGoogleSignIn::finishSignIn);
    signInTimer_.start(signInTimeoutMs_);
    platform::logDefault(QStringLiteral("YouTube sign-in: waiting for the browser"));
    flow_->grant();
}

void YouTubeGoogleSignIn::finishSignIn(const ErrorPtr& error) {
    if (!flow_)
        return; // already finished: a late signal of the same sign-in
    signInTimer_.stop();
    flow_->disconnect(this);
    flow_->deleteLater();
    flow_ = nullptr;
    if (loopback_) {
        loopback_->close();
        loopback_->deleteLater();
    }
    if (error)
        platform::logError(QStringLiteral("YouTube sign-in: %1").arg(error->message()));
    else
        setSignedIn(true);
    const auto waiting = std::exchange(signInWaiting_, {});
    for (const Handler& handler : waiting)
        handler(error);
}

void YouTubeGoogleSignIn::accessToken(bool renew, TokenHandler handler) {
    const AccessToken current = accessTokens().value(client_.identifier);
    if (!renew && !current.token.isEmpty() &&
        (!current.expiry.isValid() ||
         current.expiry > QDateTime::currentDateTimeUtc().addSecs(kTokenMarginSeconds))) {
        platform::MainQueue::async([handler, token = current.token] { handler(token, nullptr); });
        return;
    }
    tokenWaiting_ << std::move(handler);
    if (refreshing_)
        return;
    refreshing_ = true;
    QPointer<YouTubeGoogleSignIn> self(this);
    RefreshTokenStore::shared().load(client_.identifier, [self](const QString& refreshToken) {
        if (!self)
            return;
        if (refreshToken.isEmpty())
            self->finishRefresh(QString(), notSignedIn());
        else
            self->refresh(refreshToken);
    });
}

// Qt Network Authorization 6.4 refreshes only through a flow that has just
// signed in, and a refused refresh leaves it waiting for ever; the request is
// one form post, made here.
void YouTubeGoogleSignIn::refresh(const QString& refreshToken) {
    QUrlQuery form;
    form.addQueryItem(QStringLiteral("grant_type"), QStringLiteral("refresh_token"));
    form.addQueryItem(QStringLiteral("refresh_token"),
                      QString::fromLatin1(QUrl::toPercentEncoding(refreshToken)));
    form.addQueryItem(QStringLiteral("client_id"),
                      QString::fromLatin1(QUrl::toPercentEncoding(client_.identifier)));
    if (!client_.secret.isEmpty())
        form.addQueryItem(QStringLiteral("client_secret"),
                          QString::fromLatin1(QUrl::toPercentEncoding(client_.secret)));
    QNetworkRequest request(Endpoints::current().token);
    request.setHeader(QNetworkRequest::ContentTypeHeader,
                      QByteArrayLiteral("application/x-www-form-urlencoded"));
    request.setTransferTimeout(30000);
    QNetworkReply* reply = network_->post(request, form.query(QUrl::FullyEncoded).toLatin1());
    connect(reply, &QNetworkReply::finished, this, [this, reply] {
        reply->deleteLater();
        const int status = reply->attribute(QNetworkRequest::HttpStatusCodeAttribute).toInt();
        const QJsonObject answer = QJsonDocument::fromJson(reply->readAll()).object();
        if (status == 200) {
            const QString token = answer.value(QLatin1String("access_token")).toString();
            const int lifetime = answer.value(QLatin1String("expires_in")).toInt();
            if (!token.isEmpty()) {
                accessTokens().insert(
                    client_.identifier,
                    {token, lifetime > 0 ? QDateTime::currentDateTimeUtc().addSecs(lifetime)
                                         : QDateTime()});
                setSignedIn(true);
                finishRefresh(token, nullptr);
                return;
            }
        }
        const QString error = answer.value(QLatin1String("error")).toString();
        if (error == QLatin1String("invalid_grant") ||
            error == QLatin1String("unauthorized_client")) {
            // The user revoked the access, or it expired: only a new sign-in helps.
            RefreshTokenStore::shared().erase(client_.identifier);
            accessTokens().remove(client_.identifier);
            setSignedIn(false);
            finishRefresh(QString(), PublishingError::make(
                                         PublishingError::Unauthorized,
                                         QStringLiteral("Google no longer accepts the sign-in; "
                                                        "sign in again")));
            return;
        }
        finishRefresh(QString(),
                      PublishingError::make(
                          PublishingError::SignInFailed,
                          status == 0 ? QStringLiteral("Google's sign-in could not be reached: %1")
                                            .arg(reply->errorString())
                                      : QStringLiteral("Google's sign-in answered HTTP %1 %2")
                                            .arg(status)
                                            .arg(error)));
    });
}

void YouTubeGoogleSignIn::finishRefresh(const QString& accessToken, const ErrorPtr& error) {
    refreshing_ = false;
    const auto waiting = std::exchange(tokenWaiting_, {});
    for (const TokenHandler& handler : waiting)
        handler(accessToken, error);
}

void YouTubeGoogleSignIn::signOut() {
    RefreshTokenStore::shared().erase(client_.identifier);
    accessTokens().remove(client_.identifier);
    setSignedIn(false);
}
