#pragma once

#include "TXVideoEditorViewControllerDelegate.h"
#include "platform/media/Asset.h"
#include "platform/media/ExportSession.h"
#include "platform/media/ImageGenerator.h"
#include "platform/media/playback/KeyValueObserver.h"
#include "platform/media/playback/Notification.h"
#include "platform/media/playback/Player.h"
#include "platform/media/playback/PlayerItem.h"
#include "platform/media/playback/PlayerLayer.h"
#include "platform/ui/BackdropView.h"
#include "platform/ui/Label.h"
#include "platform/ui/TapRecognizer.h"
#include "platform/ui/Toolbar.h"
#include "platform/ui/ToolbarDelegate.h"
#include "platform/ui/ToolbarItem.h"
#include "platform/ui/View.h"
#include "platform/ui/ViewController.h"
#include "platform/ui/ViewHandle.h"
#include "platform/ui/scrubber/MovieScrubber.h"

#include <QColor>
#include <QHash>
#include <QImage>
#include <QStringList>
#include <QUrl>
#include <atomic>
#include <memory>

class TXVideoOverlayButton;

// The editing screen: previews one recorded movie, trims it on the movie
// scrubber, saves it to the album and reports to its delegate which
// activities the user completed. One class; its facets live in
// TXVideoEditorViewController_<Facet>.cpp.
//
// Main thread only, except where a completion says otherwise. Held by
// std::shared_ptr (made by the init functions); observer callbacks hold it
// weakly, work queued to the main queue strongly.
class TXVideoEditorViewController : public platform::ViewController,
                                    public platform::ToolbarDelegate,
                                    public platform::MovieScrubberDelegate,
                                    public platform::MovieScrubberDataSource,
                                    public platform::KeyValueObserver {
    Q_OBJECT
  public:
    // Builds the complete editor in intro mode. A null URL is accepted (the
    // extension may build an editor before its inputs have arrived).
    static std::shared_ptr<TXVideoEditorViewController>
    initWithBundleIdentifier_URL_applicationName_overrideTintColor(const QString& bundleIdentifier,
                                                                   const QUrl& url,
                                                                   const QString& applicationName,
                                                                   const QColor& overrideTintColor);
    static std::shared_ptr<TXVideoEditorViewController>
    initWithBundleIdentifier_URL_applicationName(const QString& bundleIdentifier, const QUrl& url,
                                                 const QString& applicationName);
    ~TXVideoEditorViewController() override;

    // Model (TXVideoEditorViewController.cpp)
    QUrl videoURL;
    std::shared_ptr<platform::Player> avPlayer;
    platform::ViewHandle<platform::PlayerLayer> avPlayerLayer;
    std::shared_ptr<platform::PlayerItem> avPlayerItem;
    std::shared_ptr<platform::Asset> avAsset;
    platform::ViewHandle<platform::BackdropView> scrubberContainterView;
    platform::TimeObserverToken playbackTimeObserver;
    QString applicationName;
    QString bundleIdentifier;
    platform::TimeObserverToken timeObserver;
    bool isExporting() const { return exporting_; }
    void setExporting(bool exporting) { exporting_ = exporting; }
    bool isScrubbing() const { return scrubbing_; }
    void setScrubbing(bool scrubbing) { scrubbing_ = scrubbing; }
    bool isTrimming() const { return trimming_; }
    void setTrimming(bool trimming) { trimming_ = trimming; }
    bool isPadMode() const { return padMode_; }
    void setPadMode(bool padMode) { padMode_ = padMode; }
    bool isIntroMode() const { return introMode_; }
    void setIntroMode(bool introMode) { introMode_ = introMode; }
    bool isUIHidden() const { return uiHidden_; }
    void setUiHidden(bool hidden) { uiHidden_ = hidden; }
    platform::ViewHandle<platform::Toolbar> bottomToolBar;
    platform::ViewHandle<platform::Toolbar> topToolBar;
    std::shared_ptr<platform::ToolbarItem> shareButton;
    std::shared_ptr<platform::ToolbarItem> pauseButton;
    std::shared_ptr<platform::ToolbarItem> saveButton;
    std::shared_ptr<platform::ToolbarItem> flexSpace;
    std::shared_ptr<platform::ToolbarItem> doneButton;
    std::shared_ptr<platform::ToolbarItem> cancelButton;
    std::shared_ptr<platform::ToolbarItem> cancelTrimButton;
    std::shared_ptr<platform::ToolbarItem> trimButton;
    std::shared_ptr<platform::ToolbarItem> undoButton;
    std::shared_ptr<platform::ToolbarItem> titleButton;
    std::shared_ptr<platform::ToolbarItem> playButton;
    std::shared_ptr<platform::ToolbarItem> fixSpace;
    // The big play button; its view is kept by the handle, also after it has
    // left the view tree, so the pointer stays good while the editor lives.
    TXVideoOverlayButton* videoOverlayPlayButton = nullptr;
    platform::ViewHandle<QWidget> videoOverlayPlayButtonView;
    platform::ViewHandle<platform::View> videoOverlay;
    platform::Label* titleLabel = nullptr; // owned by titleButton
    double editStartTime = 0;
    double editEndTime = 0;
    QUrl trimFilePath;
    QUrl originalVideoURL;
    std::shared_ptr<platform::ExportSession> exportSession;
    platform::ViewHandle<platform::MovieScrubber> avTrimmer;
    std::shared_ptr<platform::ImageGenerator> thumbnailGenerator;
    std::shared_ptr<QHash<double, QImage>> cachedTimeStamps;
    QStringList activityTypes;
    bool hasEdit() const { return hasEdit_.load(); }
    void setHasEdit(bool hasEdit) { hasEdit_.store(hasEdit); }
    std::weak_ptr<TXVideoEditorViewControllerDelegate> delegate;
    QUrl fileAttachmentURL;
    QString overrideShareMessage;

    // Playback (TXVideoEditorViewController_Playback.cpp)
    void reloadAVLayerWithURL(const QUrl& url);
    void observeValueForKeyPath_ofObject_change_context(const QString& keyPath, const void* object,
                                                        const QVariantMap& change,
                                                        void* context) override;
    void itemDidFinishPlaying(const platform::Notification& notification);
    Q_INVOKABLE void playAction();
    Q_INVOKABLE void pauseAction();
    void refreshAVRotation();

    // Trimming (TXVideoEditorViewController_Trimming.cpp)
    void movieScrubber_valueDidChange(platform::MovieScrubber* scrubber, double value) override;
    void movieScrubberDidBeginScrubbing_withHandle(platform::MovieScrubber* scrubber,
                                                   platform::MovieScrubberHandle handle) override;
    void movieScrubberDidEndScrubbing_withHandle(platform::MovieScrubber* scrubber,
                                                 platform::MovieScrubberHandle handle) override;
    void movieScrubberDidBeginEditing(platform::MovieScrubber* scrubber) override;
    void movieScrubber_editingStartValueDidChange(platform::MovieScrubber* scrubber,
                                                  double value) override;
    void movieScrubber_editingEndValueDidChange(platform::MovieScrubber* scrubber,
                                                double value) override;
    void movieScrubberDidCancelEditing(platform::MovieScrubber* scrubber) override;
    void editMode();
    void previewMode();
    void undoAction();
    bool canBecomeFirstResponder() const override { return true; }
    void motionEnded_withEvent(platform::MotionEvent::Subtype motion,
                               const platform::MotionEvent& event) override;

    // Thumbnails (TXVideoEditorViewController_Thumbnails.cpp)
    QList<double> movieScrubber_evenlySpacedTimestamps_startingAt_endingAt(
        platform::MovieScrubber* scrubber, int count, double start, double end) override;
    float movieScrubberThumbnailAspectRatio(platform::MovieScrubber* scrubber) override;
    void movieScrubber_requestThumbnailImageForTimestamp(platform::MovieScrubber* scrubber,
                                                         double timestamp) override;
    double movieScrubberDuration(platform::MovieScrubber* scrubber) override;
    void setThumbnailFromCacheWithTimeStamp(double timestamp);
    QSizeF getVideoSize();
    double getPlayerDuration();
    QSizeF getThumbnailSize();

    // Export and saving (TXVideoEditorViewController_Export.cpp)
    QUrl trimFileURL();
    Q_INVOKABLE void saveAction();
    void exportTrimVideoSaveToCameraRoll();
    Q_INVOKABLE void doneAction();

    // Share sheet (TXVideoEditorViewController_Share.cpp)
    Q_INVOKABLE void shareAction();
    // Looks up the recorded application's store details, then presents the
    // activity sheet on the movie at `url`.
    void displayShareSheetWithVideoURL(const QUrl& url);

    // Layout (TXVideoEditorViewController_Layout.cpp)
    void applyPhoneUILayout();
    void applyPadUILayout();
    void applyPhoneConstraints();
    void applyPadConstraints();
    int currentOrientation();
    void viewWillTransitionToSize_withTransitionCoordinator(
        const QSizeF& size, platform::TransitionCoordinator& coordinator) override;
    void viewDidLayoutSubviews() override;
    void handleSingleTap(platform::TapRecognizer* recognizer);
    void configureReplayUIHidden();
    void showUI();
    void hideUI();
    void viewWillAppear(bool animated) override;
    void viewDidAppear(bool animated) override;
    void viewWillDisappear(bool animated) override;

  protected:
    void loadView() override;

  private:
    TXVideoEditorViewController() = default;
    void init(const QString& bundleIdentifier, const QUrl& url, const QString& applicationName,
              const QColor& overrideTintColor);
    // The layout rule shared by construction and size transitions.
    void chooseLayout();
    // The editor as the scrubber's and the toolbars' weakly held partner.
    std::shared_ptr<TXVideoEditorViewController> self();
    std::weak_ptr<TXVideoEditorViewController> weakSelf();
    void addPeriodicPlayheadObserver();
    void startTrimExport();
    void addStatusObserver();
    void removeStatusObserver();
    void observeEndOfPlay();

    bool exporting_ = false;
    bool scrubbing_ = false;
    bool trimming_ = false;
    bool padMode_ = false;
    bool introMode_ = false;
    bool uiHidden_ = false;
    std::atomic<bool> hasEdit_{false};
    // The item whose "status" is observed, so the observation can be undone
    // even after the player has moved on.
    std::weak_ptr<platform::PlayerItem> statusObserved_;
};
