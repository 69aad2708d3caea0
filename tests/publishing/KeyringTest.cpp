// Runs only inside with-keyring.sh: a private session bus with an unlocked
// GNOME keyring.
#include "FakeBrowser.h"
#include "FakeYouTubeServer.h"
#include "RefreshTokenStore.h"
#include "YouTubeGoogleSignIn.h"
#include "support/LogCapture.h"
#include "support/TempDir.h"
#include "support/Wait.h"

#include <QTemporaryDir>
#include <gtest/gtest.h>
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

} // namespace

TEST(Keyring, TheRefreshTokenLivesInTheSecretStoreAcrossSessionsAndGoesWithSignOut) {
    ASSERT_TRUE(qEnvironmentVariableIsSet("TAMSEL_TEST_KEYRING"))
        << "run through tests/publishing/with-keyring.sh";
    QTemporaryDir storage;
    FakeYouTubeServer server(storage.path());
    ASSERT_TRUE(server.start());
    ScopedEnv env;
    for (const QString& line : server.environment()) {
        const qsizetype equals = line.indexOf(QLatin1Char('='));
        env.set(line.left(equals).toLatin1().constData(), line.mid(equals + 1).toUtf8());
    }
    LogCapture log;
    ScopedBrowser browser;

    {
        YouTubeGoogleSignIn google;
        std::optional<platform::ErrorPtr> result;
        google.signIn([&](platform::ErrorPtr error) { result = error; });
        ASSERT_TRUE(waitUntil([&] { return result.has_value(); }, 30000));
        ASSERT_EQ(*result, nullptr) << (*result)->description().toStdString();
    }
    ASSERT_EQ(server.issuedRefreshTokens().size(), 1);
    const QString issued = server.issuedRefreshTokens().first();
    std::optional<QString> stored;
    ASSERT_TRUE(waitUntil([&] { return (stored = storedToken()) && *stored == issued; }, 10000))
        << "in the keyring: " << stored.value_or(QStringLiteral("(no answer)")).toStdString();
    EXPECT_FALSE(RefreshTokenStore::shared().isMemoryOnly());
    EXPECT_TRUE(log.startingWith(QStringLiteral("YouTube sign-in: no secret store")).isEmpty());

    // A later session of the editor: nothing in memory, the keyring has it.
    RefreshTokenStore::shared().reset();
    YouTubeGoogleSignIn later;
    std::optional<platform::ErrorPtr> restored;
    later.restore([&](platform::ErrorPtr error) { restored = error; });
    ASSERT_TRUE(waitUntil([&] { return restored.has_value(); }, 10000));
    EXPECT_EQ(*restored, nullptr);
    EXPECT_TRUE(later.isSignedIn());
    std::optional<std::pair<QString, platform::ErrorPtr>> token;
    later.accessToken(true, [&](const QString& t, platform::ErrorPtr e) { token = {t, e}; });
    ASSERT_TRUE(waitUntil([&] { return token.has_value(); }));
    EXPECT_EQ(token->second, nullptr);
    EXPECT_EQ(server.counters().refreshes, 1) << "refreshed with the token from the keyring";

    later.signOut();
    EXPECT_TRUE(waitUntil([&] { return storedToken() == QString(); }, 10000));
    EXPECT_EQ(browser.browser().opened().size(), 1);
}
