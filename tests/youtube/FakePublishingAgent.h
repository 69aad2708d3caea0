#pragma once

#include "FakeUploadForm.h"
#include "platform/publishing/PublishingAgent.h"

#include <memory>

// A publishing agent for the activity's tests: its navigation stack holds a
// FakeUploadForm, and the test presses its buttons, which report to the
// delegate in the order the real agent does.
class FakePublishingAgent : public platform::PublishingAgent {
    Q_OBJECT
  public:
    Q_INVOKABLE FakePublishingAgent();
    ~FakePublishingAgent() override;

    // The agent made last (null when none lives), and whether the next one's
    // form has its members.
    static FakePublishingAgent* last();
    static inline bool nextFormHasMembers = true;

    void setDelegate(std::weak_ptr<platform::PublishingAgentDelegate> delegate) override;
    void setMediaPath(const QString& path) override { mediaPath = path; }
    std::shared_ptr<platform::NavigationController> navigationController() override {
        return navigation_;
    }
    QString mediaURL() const override { return publishedURL; }

    std::shared_ptr<platform::PublishingAgentDelegate> delegate() const { return delegate_.lock(); }
    FakeUploadForm* form() const { return form_.get(); }

    // The user's presses: Cancel; Publish (done, then publishing begins);
    // and the end of publishing, with the watch address on success.
    void pressCancel();
    void pressPublish();
    void endPublishing(platform::ErrorPtr error, const QString& watchURL = QString());

    QString mediaPath;
    QString publishedURL;
    int delegateSets = 0;

  private:
    std::weak_ptr<platform::PublishingAgentDelegate> delegate_;
    std::shared_ptr<FakeUploadForm> form_;
    std::shared_ptr<platform::NavigationController> navigation_;
};
