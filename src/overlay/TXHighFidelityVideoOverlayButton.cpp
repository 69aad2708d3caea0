#include "overlay/TXHighFidelityVideoOverlayButton.h"

#include "overlay/TXVideoOverlayConstants.h"
#include "platform/ui/ImageView.h"
#include "platform/ui/TargetAction.h"
#include "platform/ui/ViewAlpha.h"

using platform::BackdropView;
using platform::Button;

TXHighFidelityVideoOverlayButton::TXHighFidelityVideoOverlayButton(long style, QWidget* parent)
    : View(QRectF(), parent), style_(style) {
    const QImage glyph = TXVideoOverlayImageNamed(TXVideoOverlayGlyphMaskImageName);
    button_ = new Button(QRectF());
    button_->setImage(glyph, Button::State::Normal);
    button_->sizeToFit();
    setFrame(View::frameOf(button_));
    setAccessibleName(TXVideoOverlayAccessibleName());
    button_->setAccessibleName(TXVideoOverlayAccessibleName());

    button_->addHandler(Button::ControlEvent::TouchUpInside,
                        [this](Button* b) { _playButtonTapped(b); });
    button_->addHandler(Button::ControlEvent::TouchDown,
                        [this](Button* b) { _playButtonActivate(b); });
    button_->addHandler(Button::ControlEvent::TouchDragInside,
                        [this](Button* b) { _playButtonActivate(b); });
    button_->addHandler(Button::ControlEvent::TouchDragOutside,
                        [this](Button* b) { _playButtonDeactivate(b); });
    // A release outside or a cancelled press leaves the glyph as it stands.
    button_->setPassesTouchesToSuperviewRecognizers(false);

    addSubview(button_);
    setAutoresizingMask(FlexibleLeftMargin | FlexibleRightMargin | FlexibleTopMargin |
                        FlexibleBottomMargin);

    if (style == 0) {
        auto* background = new platform::ImageView(
            TXVideoOverlayImageNamed(TXVideoOverlayBackgroundMaskImageName));
        backdropView_ = new BackdropView(bounds(), 2010);
        backdropView_->setAutoresizingMask(FlexibleWidth | FlexibleHeight);
        insertSubviewBelow(backdropView_, button_);
        addSubview(background);
        backdropView_->addMaskView(background, BackdropView::MaskShape |
                                                   BackdropView::MaskIgnoresAlpha |
                                                   BackdropView::MaskInverted);
        background->setAlpha(0.0);
        backdropView_->addMaskView(button_,
                                   BackdropView::MaskShape | BackdropView::MaskIgnoresAlpha);
    }

    _playButtonDeactivate(nullptr);
}

void TXHighFidelityVideoOverlayButton::setTarget_action(QObject* target, const QByteArray& action) {
    target_ = target;
    action_ = action;
}

void TXHighFidelityVideoOverlayButton::_playButtonActivate(QObject*) {
    platform::ViewAlpha::setAlpha(button_, 0.5);
}

void TXHighFidelityVideoOverlayButton::_playButtonDeactivate(QObject*) {
    platform::ViewAlpha::setAlpha(button_, 0.3);
}

void TXHighFidelityVideoOverlayButton::_playButtonTapped(QObject*) {
    _playButtonDeactivate(nullptr);
    QObject* target = target_;
    if (target && platform::TargetAction::respondsTo(target, action_))
        platform::TargetAction::send(target, action_, this);
}
