#pragma once

#include "platform/ui/Toolbar.h"
#include "platform/ui/ToolbarDelegate.h"
#include "platform/ui/ToolbarItem.h"
#include "platform/ui/ViewController.h"

#include <memory>

namespace platform {
class BackdropView;
class ImageView;
class Label;
class MovieScrubber;
} // namespace platform
class GalleryMovieSource;
class TXYouTubeActivityProgressOverlay;

// The gallery's one screen: toolbars of every kind, a movie picture with the
// overlay play buttons of both classes on it, the progress overlay over a
// stand-in publishing panel, and the movie scrubber on the movie's
// thumbnails. Every control works; what the user does shows in a status line.
class GalleryViewController : public platform::ViewController, public platform::ToolbarDelegate {
    Q_OBJECT
  public:
    GalleryViewController();
    ~GalleryViewController() override;

    // Whether everything that arrives late (thumbnails, the spinner) is there.
    bool isSettled() const;
    QString lastReport() const { return lastReport_; }

    bool canBecomeFirstResponder() const override { return true; }
    void viewWillAppear(bool animated) override;
    void viewDidAppear(bool animated) override;
    void viewDidLayoutSubviews() override;
    void viewWillTransitionToSize_withTransitionCoordinator(
        const QSizeF& size, platform::TransitionCoordinator& coordinator) override;
    void motionEnded_withEvent(platform::MotionEvent::Subtype motion,
                               const platform::MotionEvent& event) override;
    platform::BarPosition positionForBar(platform::Toolbar& bar) override;

    Q_INVOKABLE void overlayTapped(QObject* sender);
    void presentPopover();
    void presentAlert();

  protected:
    void loadView() override;

  private:
    void report(const QString& line);
    void buildToolbars();
    void buildPicture();
    void buildScrubber();
    void showPlaying(bool playing);
    void toggleChrome();

    std::shared_ptr<GalleryMovieSource> source_;
    platform::Toolbar* topBar_ = nullptr;
    platform::Toolbar* wideBar_ = nullptr;
    platform::Toolbar* bottomBar_ = nullptr;
    platform::ImageView* picture_ = nullptr;
    platform::View* publishingPanel_ = nullptr;
    TXYouTubeActivityProgressOverlay* progress_ = nullptr;
    platform::BackdropView* scrubberContainer_ = nullptr;
    platform::MovieScrubber* scrubber_ = nullptr;
    platform::Label* status_ = nullptr;
    QList<QWidget*> overlayButtons_;
    QList<platform::Label*> overlayCaptions_;
    bool chromeHidden_ = false;
    QString lastReport_;

    std::shared_ptr<platform::ToolbarItem> share_, play_, pause_, undo_, done_, cancel_, save_,
        cancelTrim_, trimDone_, wideShare_, widePlay_, flex_, fixed_, title_;
};
