#include "ServerFixture.h"

#include "RefreshTokenStore.h"
#include "YouTubeGoogleSignIn.h"

#include "platform/runtime/MainQueue.h"

namespace testing_support {

void ServerFixture::SetUp() {
    ASSERT_TRUE(server_.start());
    for (const QString& line : server_.environment())
        env_.set(line.section('=', 0, 0).toLatin1().constData(), line.section('=', 1).toUtf8());
    env_.set("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nonexistent/tamsel-test-bus");
    env_.unset("DISPLAY");
    youtube_publishing::RefreshTokenStore::shared().reset();
    makeSignIn()->signOut();
}

void ServerFixture::TearDown() {
    platform::MainQueue::runPending();
}

std::shared_ptr<platform::YouTubeSignIn> ServerFixture::makeSignIn() {
    return std::make_shared<YouTubeGoogleSignIn>();
}

void ServerFixture::signInQuietly() {
    const QString token = QStringLiteral("1//quiet-test-refresh-token");
    server_.addRefreshToken(token);
    youtube_publishing::RefreshTokenStore::shared().save(
        QString::fromLatin1(FakeYouTubeServer::clientId), token);
}

} // namespace testing_support
