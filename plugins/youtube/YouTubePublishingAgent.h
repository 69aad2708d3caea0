#pragma once

#include "platform/publishing/PublishingAgent.h"
#include "platform/publishing/YouTubeSignIn.h"
#include "platform/publishing/YouTubeUploadClient.h"

#include <memory>

class YouTubeUploadForm;
namespace youtube_publishing {
class MediaFileWaiter;
}

// The YouTube publishing plug-in's agent: a navigation stack whose first
// controller is the upload form. Publish signs the user in if needed (in the
// browser), waits until the file to publish is complete, and uploads it with
// the form showing the progress; the published video's web address becomes
// mediaURL. The sign-in and the upload client come from their platform
// factories (the plug-in's own, unless a test replaced them).
//
// The delegate hears, in order: willBeDisplayed when the form is about to
// show; then cancelButtonClicked, or doneButtonClicked, didBeginPublishing
// and, once, didEndPublishing.
//
// Made by name through the class registry; main thread only.
class YouTubePublishingAgent : public platform::PublishingAgent {
    Q_OBJECT
    Q_PROPERTY(QString mediaURL READ mediaURL)
    Q_PROPERTY(QString mediaPath READ mediaPath)
  public:
    Q_INVOKABLE YouTubePublishingAgent();
    ~YouTubePublishingAgent() override;

    void setDelegate(std::weak_ptr<platform::PublishingAgentDelegate> delegate) override;
    void setMediaPath(const QString& path) override;
    std::shared_ptr<platform::NavigationController> navigationController() override;
    QString mediaURL() const override { return mediaURL_; }
    QString mediaPath() const { return mediaPath_; }

    YouTubeUploadForm* form() const { return form_.get(); }
    youtube_publishing::MediaFileWaiter* mediaWaiter() const { return waiter_; }

  private:
    void formAboutToShow();
    void refreshAccount();
    void loadCategories();
    void signInFromForm();
    void signOutFromForm();
    void publish();
    void ensureSignedIn();
    QString mediaHostPath() const;
    void waitForMedia();
    void startUpload();
    void endPublishing(const platform::ErrorPtr& error);
    std::shared_ptr<platform::PublishingAgentDelegate> delegate() const { return delegate_.lock(); }

    std::shared_ptr<platform::YouTubeSignIn> signIn_;
    std::shared_ptr<platform::YouTubeUploadClient> client_;
    std::shared_ptr<YouTubeUploadForm> form_;
    std::shared_ptr<platform::NavigationController> navigation_;
    std::weak_ptr<platform::PublishingAgentDelegate> delegate_;
    youtube_publishing::MediaFileWaiter* waiter_;
    platform::YouTubeUpload upload_;
    QString mediaPath_;
    QString mediaURL_;
    bool categoriesFromService_ = false;
    bool publishing_ = false;
};
