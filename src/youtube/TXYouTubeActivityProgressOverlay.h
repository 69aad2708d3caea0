#pragma once

#include "platform/ui/ActivityIndicator.h"
#include "platform/ui/View.h"
#include "platform/ui/ViewHandle.h"

// The dimming layer with a spinner that lies over the publishing screen while
// an upload runs. Its creator gives it a frame, adds it as a subview and
// shows or hides it with setShowing_animated. Showing fades it in over 0.2 s
// and then adds the spinner at its centre; hiding takes the spinner away,
// fades out over 0.2 s and then leaves the superview. Main thread only.
class TXYouTubeActivityProgressOverlay : public platform::View {
    Q_OBJECT
  public:
    explicit TXYouTubeActivityProgressOverlay(const QRectF& frame, QWidget* parent = nullptr);

    // The spinner, from the end of the fade-in on; stopActivity takes it off
    // screen but keeps it here.
    platform::ActivityIndicator* activityIndicator() const { return activityIndicator_.get(); }
    bool isShowing() const { return showing_; }

    // setShowing:animated:. Nothing happens when `showing` is what it is.
    void setShowing_animated(bool showing, bool animated);
    // setupOverlayAnimated: and tearDownOverlayAnimated:. Both always
    // animate; the flag is accepted and not used.
    void setupOverlayAnimated(bool animated);
    void tearDownOverlayAnimated(bool animated);
    void stopActivity();

  private:
    platform::ViewHandle<platform::ActivityIndicator> activityIndicator_;
    bool showing_ = false;
};
