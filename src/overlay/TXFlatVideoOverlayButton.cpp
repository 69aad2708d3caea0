#include "overlay/TXFlatVideoOverlayButton.h"

#include "overlay/TXVideoOverlayConstants.h"
#include "platform/ui/ImageContext.h"
#include "platform/ui/TargetAction.h"

#include <mutex>

using platform::BlendMode;
using platform::ImageContext;

TXFlatVideoOverlayButton::TXFlatVideoOverlayButton(long style, QWidget* parent)
    : Button(QRectF(), parent), style_(style) {
    setImage(_normalButtonImage(), State::Normal);
    setImage(_highlightedButtonImage(), State::Highlighted);
    sizeToFit();
    setAccessibleName(TXVideoOverlayAccessibleName());
    setPassesTouchesToSuperviewRecognizers(false);
    addHandler(ControlEvent::TouchUpInside, [this](Button* sender) { _handleTap(sender); });
}

void TXFlatVideoOverlayButton::setTarget_action(QObject* target, const QByteArray& action) {
    target_ = target;
    action_ = action;
}

void TXFlatVideoOverlayButton::_handleTap(QObject*) {
    QObject* target = target_;
    if (target && platform::TargetAction::respondsTo(target, action_))
        platform::TargetAction::send(target, action_, this);
}

QImage TXFlatVideoOverlayButton::_normalButtonImage() {
    static std::once_flag once;
    static QImage image;
    std::call_once(once, [] {
        image =
            _createOverlayImageWithBackgroundWhite_backgroundAlpha_glyphAlpha(0.96f, 0.96f, 0.3f);
    });
    return image;
}

QImage TXFlatVideoOverlayButton::_highlightedButtonImage() {
    static std::once_flag once;
    static QImage image;
    std::call_once(once, [] {
        image =
            _createOverlayImageWithBackgroundWhite_backgroundAlpha_glyphAlpha(0.96f, 0.96f, 0.5f);
    });
    return image;
}

QImage TXFlatVideoOverlayButton::_createOverlayImageWithBackgroundWhite_backgroundAlpha_glyphAlpha(
    float backgroundWhite, float backgroundAlpha, float glyphAlpha) {
    const QImage background = TXVideoOverlayImageNamed(TXVideoOverlayBackgroundMaskImageName);
    const QImage glyph = TXVideoOverlayImageNamed(TXVideoOverlayGlyphMaskImageName);
    const QSizeF size = background.isNull() ? QSizeF(0, 0) : background.deviceIndependentSize();
    ImageContext context(size, false, 0.0);
    context.fillRect(QRectF(QPointF(0, 0), size), backgroundWhite, backgroundAlpha);
    context.drawImage(background, QPointF(0, 0), BlendMode::DestinationOut, 1.0);
    context.drawImage(glyph, QPointF(0, 0), BlendMode::DestinationOut, 1.0);
    context.drawImage(glyph, QPointF(0, 0), BlendMode::Normal, glyphAlpha);
    return context.image();
}
