#pragma once

#include "platform/publishing/PublishingError.h"
#include "platform/publishing/YouTubeSignIn.h"
#include "platform/publishing/YouTubeUploadClient.h"

#include <QList>

#include <memory>

namespace testing_support {

// A sign-in the test controls: whether an account is known, and what a
// sign-in answers. Handlers come on a later turn of the loop, as the real
// one's do.
class FakeSignIn : public platform::YouTubeSignIn {
    Q_OBJECT
  public:
    bool signedIn = false;
    bool configured = true;
    platform::ErrorPtr signInAnswer; // null: the user signs in
    int signInCalls = 0;

    void restore(Handler handler) override;
    bool isSignedIn() const override { return signedIn; }
    bool isConfigured() const override { return configured; }
    void signIn(Handler handler) override;
    void accessToken(bool renew, TokenHandler handler) override;
    void signOut() override;
};

// An upload client the test drives: it records what it is asked and keeps
// the upload's handlers for the test to answer through.
class FakeUploadClient : public platform::YouTubeUploadClient {
    Q_OBJECT
  public:
    QList<platform::YouTubeVideoCategory> categories;
    platform::ErrorPtr categoriesError;
    QList<platform::YouTubeUpload> uploads;
    ProgressHandler progress;
    UploadHandler done;
    int cancels = 0;

    void setSignIn(std::shared_ptr<platform::YouTubeSignIn>) override {}
    void fetchCategories(const QString& region, const QString& language,
                         CategoriesHandler handler) override;
    void upload(const platform::YouTubeUpload& upload, ProgressHandler progress,
                UploadHandler handler) override;
    void cancel() override { ++cancels; }

    // Answers the upload under way.
    void succeed(const QString& videoId);
    void fail(platform::PublishingError::Code code, const QString& message);
};

// Makes the two fakes what the platform's factories give for their lifetime.
class ScopedFakeServices {
  public:
    ScopedFakeServices();
    std::shared_ptr<FakeSignIn> signIn = std::make_shared<FakeSignIn>();
    std::shared_ptr<FakeUploadClient> client = std::make_shared<FakeUploadClient>();

  private:
    platform::Implementation<platform::YouTubeSignIn::Maker>::Replacement signInMaker_;
    platform::Implementation<platform::YouTubeUploadClient::Maker>::Replacement clientMaker_;
};

} // namespace testing_support
