#include "RefreshTokenStore.h"
#include "ServerFixture.h"
#include "YouTubeGoogleSignIn.h"
#include "YouTubeResumableUploadClient.h"
#include "support/LogCapture.h"
#include "support/Wait.h"

#include "platform/publishing/PublishingError.h"

#include <QUrlQuery>

#include <optional>

using namespace testing_support;
using platform::ErrorPtr;
namespace PublishingError = platform::PublishingError;

namespace {

class SignInTest : public ServerFixture {
  protected:
    std::optional<ErrorPtr> signIn(YouTubeGoogleSignIn& signIn, int timeoutMs = 20000) {
        std::optional<ErrorPtr> result;
        signIn.signIn([&](ErrorPtr error) { result = error; });
        waitUntil([&] { return result.has_value(); }, timeoutMs);
        return result;
    }

    std::optional<std::pair<QString, ErrorPtr>> token(platform::YouTubeSignIn& signIn,
                                                      bool renew = false) {
        std::optional<std::pair<QString, ErrorPtr>> result;
        signIn.accessToken(renew, [&](const QString& token, ErrorPtr error) {
            result = std::pair{token, error};
        });
        waitUntil([&] { return result.has_value(); });
        return result;
    }
};

} // namespace

TEST_F(SignInTest, SignsInThroughTheBrowserWithPkceALoopbackRedirectAndTheUploadScopeOnly) {
    ScopedBrowser browser;
    YouTubeGoogleSignIn google;
    EXPECT_FALSE(google.isSignedIn());
    const auto result = signIn(google);
    ASSERT_TRUE(result.has_value()) << "the sign-in never finished";
    ASSERT_EQ(*result, nullptr) << (*result)->description().toStdString();
    EXPECT_TRUE(google.isSignedIn());

    ASSERT_EQ(browser.browser().opened().size(), 1);
    const QUrlQuery asked(server_.lastAuthorizationRequest());
    EXPECT_EQ(asked.queryItemValue(QStringLiteral("scope"), QUrl::FullyDecoded),
              QLatin1String(FakeYouTubeServer::uploadScope));
    EXPECT_EQ(asked.queryItemValue(QStringLiteral("code_challenge_method")), "S256");
    EXPECT_TRUE(asked.queryItemValue(QStringLiteral("redirect_uri"), QUrl::FullyDecoded)
                    .startsWith(QLatin1String("http://127.0.0.1:")));
    // The server checked the verifier against the challenge before answering.
    EXPECT_EQ(server_.counters().codeExchanges, 1);
    EXPECT_TRUE(waitUntil([&] { return browser.browser().lastPage().contains("Tamsel"); }))
        << "the browser is told to go back to the editor";

    // The token it got opens the API; a second sign-in of the process shares it.
    YouTubeGoogleSignIn other;
    const auto shared = token(other);
    ASSERT_TRUE(shared.has_value());
    EXPECT_EQ(shared->second, nullptr);
    EXPECT_EQ(server_.counters().refreshes, 0) << "no refresh while the token is fresh";
    const auto renewed = token(other, true);
    EXPECT_EQ(renewed->second, nullptr);
    EXPECT_NE(renewed->first, shared->first);
    EXPECT_EQ(server_.counters().refreshes, 1);
}

TEST_F(SignInTest, WithoutASecretStoreTheAccountIsKeptInMemoryAndTheLogSaysSo) {
    ScopedBrowser browser;
    LogCapture log;
    YouTubeGoogleSignIn first;
    ASSERT_EQ(signIn(first).value_or(nullptr), nullptr);
    ASSERT_TRUE(waitUntil([&] {
        return !log.startingWith(QStringLiteral("YouTube sign-in: no secret store")).isEmpty();
    }));
    EXPECT_TRUE(youtube_publishing::RefreshTokenStore::shared().isMemoryOnly());

    YouTubeGoogleSignIn later; // another form of the same editor
    std::optional<ErrorPtr> restored;
    later.restore([&](ErrorPtr error) { restored = error; });
    ASSERT_TRUE(waitUntil([&] { return restored.has_value(); }));
    EXPECT_EQ(*restored, nullptr);
    EXPECT_TRUE(later.isSignedIn());
    EXPECT_EQ(browser.browser().opened().size(), 1) << "no second trip to the browser";

    later.signOut();
    YouTubeGoogleSignIn afterSignOut;
    afterSignOut.restore([&](ErrorPtr error) { restored = error; });
    restored.reset();
    ASSERT_TRUE(waitUntil([&] { return restored.has_value(); }));
    EXPECT_TRUE(PublishingError::is(*restored, PublishingError::NotSignedIn));
}

TEST_F(SignInTest, RefusingOnTheConsentPageIsACancelledSignIn) {
    ScopedBrowser browser;
    FakeYouTubeServer::Faults faults;
    faults.denySignIn = true;
    server_.setFaults(faults);
    YouTubeGoogleSignIn google;
    const auto result = signIn(google);
    ASSERT_TRUE(result.has_value());
    EXPECT_TRUE(PublishingError::is(*result, PublishingError::SignInCancelled));
    EXPECT_FALSE(google.isSignedIn());
}

TEST_F(SignInTest, ABrowserThatNeverAnswersEndsTheSignInAfterItsTimeout) {
    ScopedBrowser browser(FakeBrowser::Behaviour::Ignore);
    YouTubeGoogleSignIn google;
    google.setSignInTimeout(200);
    const auto result = signIn(google, 5000);
    ASSERT_TRUE(result.has_value());
    EXPECT_TRUE(PublishingError::is(*result, PublishingError::SignInCancelled));
    // The loopback port is closed again: a late answer finds nobody.
    EXPECT_EQ(server_.counters().codeExchanges, 0);
}

TEST_F(SignInTest, NoBrowserAtAllFailsTheSignIn) {
    ScopedBrowser browser(FakeBrowser::Behaviour::Refuse);
    YouTubeGoogleSignIn google;
    const auto result = signIn(google);
    ASSERT_TRUE(result.has_value());
    EXPECT_TRUE(PublishingError::is(*result, PublishingError::SignInFailed));
}

TEST_F(SignInTest, ATokenRequestTheServiceRefusesFailsInsteadOfWaitingForEver) {
    ScopedBrowser browser;
    env_.set("TAMSEL_YOUTUBE_CLIENT_SECRET", "not-the-secret");
    YouTubeGoogleSignIn google;
    const auto result = signIn(google, 10000);
    ASSERT_TRUE(result.has_value()) << "the sign-in hung";
    ASSERT_TRUE(PublishingError::is(*result, PublishingError::SignInFailed));
    EXPECT_TRUE((*result)->message().contains(QStringLiteral("invalid_client")));
}

TEST_F(SignInTest, WithoutAnOAuthClientSigningInSaysItIsNotSetUp) {
    QTemporaryDir config;
    env_.unset("TAMSEL_YOUTUBE_CLIENT_ID");
    env_.unset("TAMSEL_YOUTUBE_CLIENT_SECRET");
    env_.set("XDG_CONFIG_HOME", config.path().toUtf8());
    env_.set("XDG_CONFIG_DIRS", config.path().toUtf8());
    ScopedBrowser browser;
    YouTubeGoogleSignIn google;
    EXPECT_FALSE(google.isConfigured());
    const auto result = signIn(google);
    ASSERT_TRUE(result.has_value());
    EXPECT_TRUE(PublishingError::is(*result, PublishingError::NotConfigured));
    EXPECT_TRUE(browser.browser().opened().isEmpty());
}

TEST_F(SignInTest, TheOAuthClientCanComeFromTheUsersConfigurationFile) {
    QTemporaryDir config;
    QDir(config.path()).mkpath(QStringLiteral("tamsel"));
    QFile file(config.path() + QStringLiteral("/tamsel/youtube.conf"));
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write("[oauth]\nclient_id = tamsel-test.apps.example\n"
               "client_secret = tamsel-test-secret\n");
    file.close();
    env_.unset("TAMSEL_YOUTUBE_CLIENT_ID");
    env_.unset("TAMSEL_YOUTUBE_CLIENT_SECRET");
    env_.set("XDG_CONFIG_HOME", config.path().toUtf8());
    ScopedBrowser browser;
    YouTubeGoogleSignIn google;
    EXPECT_EQ(signIn(google).value_or(nullptr), nullptr);
}
