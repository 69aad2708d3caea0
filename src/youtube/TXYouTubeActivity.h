#pragma once

#include "platform/media/ExportSession.h"
#include "platform/services/Bundle.h"
#include "platform/ui/Activity.h"
#include "platform/ui/ViewHandle.h"
#include "youtube/TXPublishingAgent.h"
#include "youtube/TXYouTubeActivityProgressOverlay.h"

#include <QImage>
#include <QString>
#include <QUrl>
#include <QVariantList>

#include <memory>

// The share sheet's activity that publishes the recording to YouTube through
// the platform's YouTube publishing plug-in. The share sheet creates it with
// its plain initialiser and offers it only where publishing support is
// installed.
//
// The sheet's items are, in order: a share text, a link (or anything whose
// text belongs after the share text), the movie's file URL. When the user
// picks the activity it exports the movie for upload into the temporary
// store, hands the file to the plug-in's agent, pre-fills the agent's form
// and preselects a category, shows the progress overlay while the agent
// publishes and ends with an alert; the alert's buttons finish the activity.
//
// Main thread only, except the export's completion (which only logs). Held by
// std::shared_ptr (init()); the agent holds it weakly as its delegate, the
// alert's buttons weakly too (the sheet holds it until it has finished).
//
// A missing plug-in or agent class stops the process (qFatal) when the
// activity first needs the agent: the sheet must not offer the activity
// where the plug-in is not installed.
class TXYouTubeActivity : public platform::Activity, public TXPublishingAgentDelegate {
    Q_OBJECT
  public:
    static std::shared_ptr<TXYouTubeActivity> init();
    ~TXYouTubeActivity() override;

    // The upload file in the temporary store; set by prepareWithActivityItems.
    QUrl movieURL;
    // The plug-in's agent; made by activityViewController.
    std::shared_ptr<TXPublishingAgent> publishingAgent;
    // What goes into the form's description field: the share text, a blank,
    // then the link.
    QString descriptionText;
    // Over the agent's screen from the start of publishing on.
    platform::ViewHandle<TXYouTubeActivityProgressOverlay> progressOverlay;
    // Kept for those who set it; no flow of the activity reads it.
    QUrl tempFilePath;

    // Identity: "TXPublishToYouTube", "YouTube", the share category.
    QString activityType() const override;
    QString activityTitle() const override;
    QImage activityImage() const override;
    // The icon on an application-icon tile as a settings list shows it.
    QImage _activitySettingsImage() const override;
    platform::ActivityCategory activityCategory() const override;

    // The items are not looked at: the device decides.
    bool canPerformWithActivityItems(const QVariantList& items) override;
    // Starts the export of items[2] into a new tempFileURL (movieURL) and sets
    // descriptionText from items[0] and items[1]. Returns at once; nothing
    // waits for the export. A missing item reads as none (the export then
    // fails, and the agent reports the failure when it publishes).
    void prepareWithActivityItems(const QVariantList& items) override;
    // Makes the agent (loading the plug-in on first use), gives it movieURL,
    // pre-fills its form's description, arms the category preselection and
    // returns the agent's navigation controller. Null (the sheet then
    // performs the activity, which finishes it as not completed) when the
    // registered class makes no agent.
    std::shared_ptr<platform::ViewController> activityViewController() override;

    // A new upload-file URL: "TXCapture_YouTube", the whole seconds since
    // 1970 and ".mp4" in the temporary directory. Two calls within the same
    // second give the same name.
    QUrl tempFileURL() const;

    // The agent's reports.
    void publishingAgentWillBeDisplayed(TXPublishingAgent* agent) override;
    void publishingAgentDoneButtonClicked(TXPublishingAgent* agent) override;
    void publishingAgentCancelButtonClicked(TXPublishingAgent* agent) override;
    void publishingAgentDidBeginPublishing(TXPublishingAgent* agent) override;
    void publishingAgentDidEndPublishing_error(TXPublishingAgent* agent,
                                               platform::ErrorPtr error) override;

    // The final alert over the agent's screen: failure with Close alone, or
    // success with View and Close. View finishes as completed and opens the
    // video's address; Close finishes as completed exactly after a failure.
    void showAlertWithError(platform::ErrorPtr error);

    // Preselects the category whose id is "20" in the form `receiver`: its
    // picker row, its category cell and its "_defaultCategory". Runs as the
    // form's own "_selectComedyPickerRow" once activityViewController has
    // exchanged the two classes' implementations. Does nothing to a form
    // without categories or without that category.
    static void _selectComedyPickerRow(QObject* receiver);

    // The platform's photo user-interface bundle, located once through one of
    // its classes and kept; null when it is not installed.
    static std::shared_ptr<platform::Bundle> photoUIBundle();
    // An image of that bundle by name at the main screen's scale; null when
    // there is none.
    static QImage photoUIImageNamed(const QString& name);

  protected:
    TXYouTubeActivity() = default;

  private:
    // The agent's class: the plug-in is loaded on first use and the class
    // kept; later uses do not load again.
    static const QMetaObject* publishingAgentClass();
    // Removes the upload file; an export still writing it is stopped first,
    // so that nothing lands in the temporary store after the removal.
    void removeMovieFile();

    std::shared_ptr<platform::ExportSession> exportSession_;
};
