#pragma once

#include "platform/publishing/PublishingError.h"
#include "platform/publishing/YouTubeSignIn.h"
#include "platform/publishing/YouTubeUploadClient.h"

#include <QList>

namespace testing_support {

// A sign-in the test controls: whether an account is known, and what a
// sign-in answers (null: the user signs in). Handlers come on a later turn of
// the loop, as the real one's do.
class FakeSignIn : public platform::YouTubeSignIn {
    Q_OBJECT
  public:
    bool signedIn = false;
    bool configured = true;
    platform::ErrorPtr signInAnswer;
    int signInCalls = 0;

    void restore(Handler handler) override;
    bool isSignedIn() const override { return signedIn; }
    bool isConfigured() const override { return configured; }
    void signIn(Handler handler) override;
    void accessToken(bool, TokenHandler handler) override;
    void signOut() override {
        signedIn = false;
        emit signedInChanged(false);
    }
};

// An upload client the test drives: it records the uploads and keeps their
// handlers for the test to answer through.
class FakeUploadClient : public platform::YouTubeUploadClient {
    Q_OBJECT
  public:
    QList<platform::YouTubeVideoCategory> categories;
    QList<platform::YouTubeUpload> uploads;
    ProgressHandler progress;
    UploadHandler done;

    void setSignIn(std::shared_ptr<platform::YouTubeSignIn>) override {}
    void fetchCategories(const QString&, const QString&, CategoriesHandler handler) override;
    void upload(const platform::YouTubeUpload& upload, ProgressHandler progress,
                UploadHandler handler) override;
    void cancel() override {}
    // Ends the upload under way: published as `videoId`, or failed with `code`.
    void succeed(const QString& videoId);
    void fail(platform::PublishingError::Code code, const QString& message);
};

} // namespace testing_support
