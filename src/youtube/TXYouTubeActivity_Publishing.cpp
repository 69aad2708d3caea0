// The agent's reports and the final alert.

#include "TXYouTubeActivity.h"

#include "platform/ui/Alert.h"
#include "platform/ui/UrlOpener.h"
#include "support/FrameworkStrings.h"
#include "support/StringFormat.h"

using namespace platform;

namespace {

View* viewOfNavigationController(TXPublishingAgent* agent) {
    const auto navigationController = agent ? agent->navigationController() : nullptr;
    return navigationController ? navigationController->view() : nullptr;
}

} // namespace

void TXYouTubeActivity::publishingAgentWillBeDisplayed(TXPublishingAgent*) {}

void TXYouTubeActivity::publishingAgentDoneButtonClicked(TXPublishingAgent* agent) {
    if (View* view = viewOfNavigationController(agent))
        view->endEditing(true);
}

void TXYouTubeActivity::publishingAgentCancelButtonClicked(TXPublishingAgent*) {
    activityDidFinish(false);
    removeMovieFile();
}

void TXYouTubeActivity::publishingAgentDidBeginPublishing(TXPublishingAgent* agent) {
    View* view = viewOfNavigationController(agent);
    progressOverlay = ViewHandle<TXYouTubeActivityProgressOverlay>(
        new TXYouTubeActivityProgressOverlay(view ? view->bounds() : QRectF()));
    if (view)
        view->addSubview(progressOverlay.get());
    progressOverlay->setShowing_animated(true, true);
}

void TXYouTubeActivity::publishingAgentDidEndPublishing_error(TXPublishingAgent*, ErrorPtr error) {
    showAlertWithError(error);
    removeMovieFile();
}

void TXYouTubeActivity::showAlertWithError(ErrorPtr error) {
    if (progressOverlay)
        progressOverlay->stopActivity();

    // The sheet holds the activity until it has finished, which only these
    // buttons do; holding it weakly keeps the alert from keeping it alive.
    const std::weak_ptr<TXYouTubeActivity> weakSelf =
        std::static_pointer_cast<TXYouTubeActivity>(shared_from_this());
    std::shared_ptr<Alert> alert;
    if (error) {
        alert = Alert::make(TXLocalizedFrameworkString(QStringLiteral("FAILED_PUBLISH_VIDEO")),
                            QString(), Alert::Style::Alert);
    } else {
        alert = Alert::make(TXLocalizedFrameworkString(QStringLiteral("PUBLISHED_VIDEO")),
                            QString(), Alert::Style::Alert);
        const QString viewTitle =
            stringWithFormat(TXLocalizedFrameworkString(QStringLiteral("VIEW_BUTTON_TITLE_FORMAT")),
                             {activityTitle()});
        alert->addAction(
            AlertAction::make(viewTitle, AlertAction::Style::Default, [weakSelf](AlertAction&) {
                const auto self = weakSelf.lock();
                if (!self)
                    return;
                const QUrl videoURL(self->publishingAgent ? self->publishingAgent->mediaURL()
                                                          : QString());
                self->activityDidFinish(true);
                UrlOpener::sharedOpener()->openURL(videoURL);
            }));
    }
    // Deliberately asymmetric: after a failure Close reports the activity as
    // completed; after a success only the view button does.
    const bool failed = bool(error);
    alert->addAction(AlertAction::make(TXLocalizedFrameworkString(QStringLiteral("CLOSE")),
                                       AlertAction::Style::Cancel,
                                       [weakSelf, failed](AlertAction&) {
                                           if (const auto self = weakSelf.lock())
                                               self->activityDidFinish(failed);
                                       }));

    if (const auto navigationController =
            publishingAgent ? publishingAgent->navigationController() : nullptr)
        navigationController->presentViewController_animated_completion(alert, true, {});
}
