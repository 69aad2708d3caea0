#pragma once

#include "overlay/TXVideoOverlayButton.h"
#include "platform/ui/Button.h"

#include <QPointer>

// The overlay play button as one pre-drawn picture: a grey disc with the glyph
// knocked out and drawn back at a low alpha, brighter while pressed. The two
// pictures are drawn once per process, on first use, and shared by every flat
// button. Main thread only, except the pictures, which any thread may ask for.
class TXFlatVideoOverlayButton : public platform::Button, public TXVideoOverlayButton {
    Q_OBJECT
  public:
    // initWithStyle:
    explicit TXFlatVideoOverlayButton(long style, QWidget* parent = nullptr);

    long style() const override { return style_; }
    void setTarget_action(QObject* target, const QByteArray& action) override;
    QWidget* view() override { return this; }

    QObject* target() const { return target_; }
    void setTarget(QObject* target) { target_ = target; }
    QByteArray action() const { return action_; }
    void setAction(const QByteArray& action) { action_ = action; }

    static QImage _normalButtonImage();
    static QImage _highlightedButtonImage();
    // Grey `backgroundWhite` at `backgroundAlpha` in the background mask's
    // shape, the glyph knocked out of it and drawn again at `glyphAlpha`; at
    // the main screen's scale. Null when the background mask is missing.
    static QImage _createOverlayImageWithBackgroundWhite_backgroundAlpha_glyphAlpha(
        float backgroundWhite, float backgroundAlpha, float glyphAlpha);

  public slots:
    void _handleTap(QObject* sender);

  private:
    long style_;
    QPointer<QObject> target_;
    QByteArray action_;
};
