#include "FakePublishingServices.h"

#include "platform/runtime/MainQueue.h"

#include <QUrl>

namespace testing_support {

using platform::MainQueue::async;
namespace PublishingError = platform::PublishingError;

void FakeSignIn::restore(Handler handler) {
    async([this, handler] {
        handler(signedIn ? nullptr
                         : PublishingError::make(PublishingError::NotSignedIn, "not signed in"));
    });
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
        if (signedIn)
            handler(QStringLiteral("token"), nullptr);
        else
            handler(QString(),
                    PublishingError::make(PublishingError::NotSignedIn, "not signed in"));
    });
}

void FakeSignIn::signOut() {
    signedIn = false;
    emit signedInChanged(false);
}

void FakeUploadClient::fetchCategories(const QString&, const QString&, CategoriesHandler handler) {
    async([this, handler] { handler(categories, categoriesError); });
}

void FakeUploadClient::upload(const platform::YouTubeUpload& upload, ProgressHandler progress,
                              UploadHandler handler) {
    uploads << upload;
    this->progress = std::move(progress);
    done = std::move(handler);
}

void FakeUploadClient::succeed(const QString& videoId) {
    if (progress)
        progress(100, 100);
    auto handler = std::exchange(done, nullptr);
    handler({videoId, QUrl(QStringLiteral("https://www.youtube.com/watch?v=") + videoId)}, nullptr);
}

void FakeUploadClient::fail(PublishingError::Code code, const QString& message) {
    auto handler = std::exchange(done, nullptr);
    handler({}, PublishingError::make(code, message));
}

ScopedFakeServices::ScopedFakeServices()
    : signInMaker_(platform::YouTubeSignIn::implementation().replace(
          [this] { return std::static_pointer_cast<platform::YouTubeSignIn>(signIn); })),
      clientMaker_(platform::YouTubeUploadClient::implementation().replace(
          [this] { return std::static_pointer_cast<platform::YouTubeUploadClient>(client); })) {}

} // namespace testing_support
