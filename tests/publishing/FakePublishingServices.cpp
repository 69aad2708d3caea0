#include "FakePublishingServices.h"

#include "platform/runtime/MainQueue.h"

#include <QUrl>

namespace testing_support {

using platform::MainQueue::async;
namespace PublishingError = platform::PublishingError;

namespace {
platform::ErrorPtr notSignedIn() {
    return PublishingError::make(PublishingError::NotSignedIn, QStringLiteral("not signed in"));
}
} // namespace

void FakeSignIn::restore(Handler handler) {
    async([this, handler] { handler(signedIn ? nullptr : notSignedIn()); });
}

void FakeSignIn::signIn(Handler handler) {
    ++signInCalls;
    async([this, handler] {
        if (!signInAnswer && !signedIn) {
            signedIn = true;
            emit signedInChanged(true);
        }
        handler(signInAnswer);
    });
}

void FakeSignIn::accessToken(bool, TokenHandler handler) {
    async([this, handler] {
        handler(signedIn ? QStringLiteral("token") : QString(), signedIn ? nullptr : notSignedIn());
    });
}

void FakeUploadClient::fetchCategories(const QString&, const QString&, CategoriesHandler handler) {
    async([this, handler] { handler(categories, nullptr); });
}

void FakeUploadClient::upload(const platform::YouTubeUpload& upload, ProgressHandler progress,
                              UploadHandler handler) {
    uploads << upload;
    this->progress = std::move(progress);
    done = std::move(handler);
}

void FakeUploadClient::succeed(const QString& videoId) {
    progress(100, 100);
    std::exchange(done, nullptr)(
        {videoId, QUrl(QStringLiteral("https://www.youtube.com/watch?v=") + videoId)}, nullptr);
}

void FakeUploadClient::fail(PublishingError::Code code, const QString& message) {
    std::exchange(done, nullptr)({}, PublishingError::make(code, message));
}

} // namespace testing_support
