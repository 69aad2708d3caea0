// Signing in with Google as a desktop application, against the local fake of
// the sign-in service and a fake browser.

#include "RefreshTokenStore.h"
#include "ServerFixture.h"
#include "ShareFakes.h"
#include "YouTubeGoogleSignIn.h"
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
    // What signing in ends with; nullopt when it never ends.
    static std::optional<ErrorPtr> signIn(YouTubeGoogleSignIn& google) {
        return awaited<ErrorPtr>([&](auto done) { google.signIn(done); }, 20000);
    }
    static std::optional<ErrorPtr> restore(YouTubeGoogleSignIn& google) {
        return awaited<ErrorPtr>([&](auto done) { google.restore(done); });
    }
    static std::pair<QString, ErrorPtr> token(YouTubeGoogleSignIn& google, bool renew) {
        return awaited<std::pair<QString, ErrorPtr>>([&](auto done) {
                   google.accessToken(renew, [done](const QString& t, ErrorPtr e) {
                       done({t, e});
                   });
               })
            .value_or(std::pair{QString(),
                                PublishingError::make(PublishingError::BadResponse, "no answer")});
    }
};

} // namespace

TEST_F(SignInTest, SignsInThroughTheBrowserWithPkceALoopbackRedirectAndTheUploadScopeOnly) {
    FakeBrowser browser(FakeBrowser::Behaviour::Follow);
    LogCapture log;
    YouTubeGoogleSignIn google;
    EXPECT_FALSE(google.isSignedIn());
    ASSERT_EQ(signIn(google), std::optional<ErrorPtr>(nullptr));
    EXPECT_TRUE(google.isSignedIn());
    ASSERT_EQ(browser.opened().size(), 1);
    const QUrlQuery asked(server_.record().lastAuthorization);
    EXPECT_EQ(asked.queryItemValue("scope", QUrl::FullyDecoded),
              QLatin1String(FakeYouTubeServer::uploadScope));
    EXPECT_EQ(asked.queryItemValue("code_challenge_method"), "S256");
    EXPECT_TRUE(asked.queryItemValue("redirect_uri", QUrl::FullyDecoded)
                    .startsWith(QLatin1String("http://127.0.0.1:")));
    // The server checked the verifier against the challenge before answering.
    EXPECT_EQ(server_.record().codeExchanges, 1);
    EXPECT_TRUE(waitUntil([&] { return browser.lastPage().contains("Tamsel"); }))
        << "the browser is told to go back to the editor";

    // Without a secret store the account is kept in memory, and the log says so.
    EXPECT_TRUE(
        waitUntil([&] { return !log.startingWith("YouTube sign-in: no secret store").isEmpty(); }));
    EXPECT_TRUE(youtube_publishing::RefreshTokenStore::shared().isMemoryOnly());
    // Another form of the same editor shares the account and its token; a
    // renewal is a refresh, not a second trip to the browser.
    YouTubeGoogleSignIn later;
    EXPECT_EQ(restore(later), std::optional<ErrorPtr>(nullptr));
    EXPECT_TRUE(later.isSignedIn());
    const auto shared = token(later, false);
    EXPECT_EQ(shared.second, nullptr);
    EXPECT_EQ(server_.record().refreshes, 0) << "no refresh while the token is fresh";
    const auto renewed = token(later, true);
    EXPECT_EQ(renewed.second, nullptr);
    EXPECT_NE(renewed.first, shared.first);
    EXPECT_EQ(server_.record().refreshes, 1);
    EXPECT_EQ(browser.opened().size(), 1);

    later.signOut();
    YouTubeGoogleSignIn afterSignOut;
    EXPECT_TRUE(
        PublishingError::is(restore(afterSignOut).value_or(nullptr), PublishingError::NotSignedIn));
}

// Each way signing in can fail ends it, with the reason, instead of waiting;
// the last, a missing OAuth client, is then configured in a file.
TEST_F(SignInTest, AFailedSignInEndsWithItsReason) {
    QTemporaryDir config;
    const struct {
        const char* what;
        FakeBrowser::Behaviour browser;
        std::function<void()> setUp;
        PublishingError::Code code;
        const char* message;
    } cases[] = {
        {"refused on the consent page", FakeBrowser::Behaviour::Follow,
         [&] { server_.setFaults({.denySignIn = true}); }, PublishingError::SignInCancelled, ""},
        {"a browser that never answers", FakeBrowser::Behaviour::Record, [] {},
         PublishingError::SignInCancelled, ""},
        {"no browser", FakeBrowser::Behaviour::Refuse, [] {}, PublishingError::SignInFailed, ""},
        {"a refused token request", FakeBrowser::Behaviour::Follow,
         [&] { env_.set("TAMSEL_YOUTUBE_CLIENT_SECRET", "not-the-secret"); },
         PublishingError::SignInFailed, "invalid_client"},
        {"no OAuth client", FakeBrowser::Behaviour::Follow,
         [&] {
             env_.unset("TAMSEL_YOUTUBE_CLIENT_ID");
             env_.unset("TAMSEL_YOUTUBE_CLIENT_SECRET");
             env_.set("XDG_CONFIG_HOME", config.path().toUtf8());
             env_.set("XDG_CONFIG_DIRS", config.path().toUtf8());
         },
         PublishingError::NotConfigured, ""},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        server_.setFaults({});
        c.setUp();
        FakeBrowser browser(c.browser);
        YouTubeGoogleSignIn google;
        if (c.browser == FakeBrowser::Behaviour::Record)
            google.setSignInTimeout(200);
        const auto result = signIn(google);
        ASSERT_TRUE(result.has_value()) << "the sign-in hung";
        EXPECT_TRUE(PublishingError::is(*result, c.code));
        EXPECT_TRUE((*result)->message().contains(QLatin1String(c.message)));
        EXPECT_FALSE(google.isSignedIn());
        EXPECT_EQ(browser.opened().isEmpty(), c.code == PublishingError::NotConfigured);
    }
    EXPECT_EQ(server_.record().codeExchanges, 0);

    // The client, missing so far, now comes from the user's configuration file.
    writeText(config.filePath("tamsel/youtube.conf"),
              "[oauth]\nclient_id = tamsel-test.apps.example\n"
              "client_secret = tamsel-test-secret\n");
    FakeBrowser browser(FakeBrowser::Behaviour::Follow);
    YouTubeGoogleSignIn google;
    EXPECT_EQ(signIn(google), std::optional<ErrorPtr>(nullptr));
}
