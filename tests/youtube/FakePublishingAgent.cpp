#include "FakePublishingAgent.h"

#include <QPointer>

using namespace platform;

namespace {
QPointer<FakePublishingAgent>& lastMade() {
    static QPointer<FakePublishingAgent> agent;
    return agent;
}
} // namespace

FakePublishingAgent::FakePublishingAgent()
    : form_(std::make_shared<FakeUploadForm>(nextFormHasMembers)),
      navigation_(NavigationController::initWithRootViewController(form_)) {
    lastMade() = this;
}

FakePublishingAgent::~FakePublishingAgent() = default;

FakePublishingAgent* FakePublishingAgent::last() {
    return lastMade().data();
}

void FakePublishingAgent::setDelegate(std::weak_ptr<PublishingAgentDelegate> delegate) {
    delegate_ = std::move(delegate);
    ++delegateSets;
}

void FakePublishingAgent::pressCancel() {
    if (auto delegate = delegate_.lock())
        delegate->publishingAgentCancelButtonClicked(this);
}

void FakePublishingAgent::pressPublish() {
    if (auto delegate = delegate_.lock())
        delegate->publishingAgentDoneButtonClicked(this);
    if (auto delegate = delegate_.lock())
        delegate->publishingAgentDidBeginPublishing(this);
}

void FakePublishingAgent::endPublishing(ErrorPtr error, const QString& watchURL) {
    if (!error)
        publishedURL = watchURL;
    if (auto delegate = delegate_.lock())
        delegate->publishingAgentDidEndPublishing_error(this, std::move(error));
}
