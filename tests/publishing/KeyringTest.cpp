// Runs only inside with-keyring.sh: a private session bus with an unlocked
// GNOME keyring.
#include "RefreshTokenStore.h"
#include "ServerFixture.h"
#include "ShareFakes.h"
#include "YouTubeGoogleSignIn.h"
#include "support/LogCapture.h"
#include "support/Wait.h"

#include <qt6keychain/keychain.h>

#include <optional>

using namespace testing_support;
using youtube_publishing::RefreshTokenStore;

namespace {

// What the secret store holds for the test client: the token, "" when there
// is no entry, nullopt when the store could not be asked.
std::optional<QString> storedToken() {
    QKeychain::ReadPasswordJob job(RefreshTokenStore::serviceName());
    job.setAutoDelete(false);
    job.setKey(QString::fromLatin1(FakeYouTubeServer::clientId));
    bool done = false;
    QObject::connect(&job, &QKeychain::Job::finished, [&] { done = true; });
    job.start();
    waitUntil([&] { return done; });
    if (job.error() == QKeychain::EntryNotFound)
        return QString();
    if (job.error() != QKeychain::NoError)
        return std::nullopt;
    return job.textData();
}

// The fixture's server with the session bus that with-keyring.sh started.
class Keyring : public ServerFixture {
    void SetUp() override {
        const QByteArray bus = qgetenv("DBUS_SESSION_BUS_ADDRESS");
        ServerFixture::SetUp();
        env_.set("DBUS_SESSION_BUS_ADDRESS", bus);
    }
};

} // namespace

TEST_F(Keyring, TheRefreshTokenLivesInTheSecretStoreAcrossSessionsAndGoesWithSignOut) {
    ASSERT_TRUE(qEnvironmentVariableIsSet("TAMSEL_TEST_KEYRING"))
        << "run through tests/publishing/with-keyring.sh";
    LogCapture log;
    FakeBrowser browser(FakeBrowser::Behaviour::Follow);
    {
        YouTubeGoogleSignIn google;
        ASSERT_EQ(awaited<platform::ErrorPtr>([&](auto done) { google.signIn(done); }, 30000),
                  std::optional<platform::ErrorPtr>(nullptr));
    }
    const QString issued = server_.record().refreshTokens.value(0);
    std::optional<QString> stored;
    ASSERT_TRUE(waitUntil([&] { return (stored = storedToken()) && *stored == issued; }, 10000))
        << "in the keyring: " << stored.value_or(QStringLiteral("(no answer)")).toStdString();
    EXPECT_FALSE(RefreshTokenStore::shared().isMemoryOnly());
    EXPECT_TRUE(log.startingWith(QStringLiteral("YouTube sign-in: no secret store")).isEmpty());

    // A later session of the editor: nothing in memory, the keyring has it.
    RefreshTokenStore::shared().reset();
    YouTubeGoogleSignIn later;
    EXPECT_EQ(awaited<platform::ErrorPtr>([&](auto done) { later.restore(done); }),
              std::optional<platform::ErrorPtr>(nullptr));
    EXPECT_EQ(awaited<platform::ErrorPtr>([&](auto done) {
                  later.accessToken(true, [done](const QString&, auto e) { done(e); });
              }),
              std::optional<platform::ErrorPtr>(nullptr));
    EXPECT_EQ(server_.record().refreshes, 1) << "refreshed with the token from the keyring";

    later.signOut();
    EXPECT_TRUE(waitUntil([&] { return storedToken() == QString(); }, 10000));
    EXPECT_EQ(browser.opened().size(), 1);
}
