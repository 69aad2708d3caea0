#include "youtube/TXYouTubeActivityProgressOverlay.h"

#include "platform/ui/Animation.h"

#include <QPointer>

using platform::ActivityIndicator;
using platform::Animation;
using platform::View;

TXYouTubeActivityProgressOverlay::TXYouTubeActivityProgressOverlay(const QRectF& frame,
                                                                   QWidget* parent)
    : View(frame, parent) {
    setAccessibleName(tr("Publishing"));
    // Laid over a screen in a window the user may resize while the upload
    // runs: the dimming keeps covering it and the spinner its middle.
    setAutoresizingMask(FlexibleWidth | FlexibleHeight);
}

void TXYouTubeActivityProgressOverlay::setShowing_animated(bool showing, bool animated) {
    if (showing == showing_)
        return;
    showing_ = showing;
    if (showing)
        setupOverlayAnimated(animated);
    else
        tearDownOverlayAnimated(animated);
}

void TXYouTubeActivityProgressOverlay::setupOverlayAnimated(bool) {
    auto* dimming = new View(bounds());
    addSubview(dimming);
    dimming->setBackgroundColor(QColor::fromRgbF(0.0f, 0.0f, 0.0f, 0.5f));
    dimming->setAutoresizingMask(FlexibleWidth | FlexibleHeight);
    setAlpha(0.0);

    QPointer<TXYouTubeActivityProgressOverlay> self(this);
    Animation::animateWithDuration(
        0.2, [this] { setAlpha(1.0); },
        [self](bool) {
            if (!self)
                return;
            auto* indicator = new ActivityIndicator(ActivityIndicator::Style::WhiteLarge);
            self->activityIndicator_ = platform::ViewHandle<ActivityIndicator>(indicator);
            indicator->startAnimating();
            const QRectF bounds = self->bounds();
            indicator->setCenter(QPointF(bounds.width() * 0.5, bounds.height() * 0.5));
            indicator->setAutoresizingMask(FlexibleLeftMargin | FlexibleRightMargin |
                                           FlexibleTopMargin | FlexibleBottomMargin);
            self->addSubview(indicator);
        });
}

void TXYouTubeActivityProgressOverlay::tearDownOverlayAnimated(bool) {
    if (activityIndicator_)
        View::removeFromSuperview(activityIndicator_.get());

    QPointer<TXYouTubeActivityProgressOverlay> self(this);
    Animation::animateWithDuration(
        0.2, [this] { setAlpha(0.0); },
        [self](bool) {
            if (self)
                self->removeFromSuperview();
        });
}

void TXYouTubeActivityProgressOverlay::stopActivity() {
    if (activityIndicator_)
        View::removeFromSuperview(activityIndicator_.get());
}
