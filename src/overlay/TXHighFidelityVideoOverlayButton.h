#pragma once

#include "overlay/TXVideoOverlayButton.h"
#include "platform/ui/BackdropView.h"
#include "platform/ui/Button.h"
#include "platform/ui/View.h"

#include <QPointer>

// The overlay play button drawn live: the glyph image in a push button, over
// a blurred backdrop of the video in the background mask's shape (style 0
// only). The view is exactly the glyph image's size and keeps its place when
// its superview resizes. The glyph is at alpha 0.3 at rest and 0.5 while a
// press is on it. Main thread only; the button and backdrop are children of
// the view.
class TXHighFidelityVideoOverlayButton : public platform::View, public TXVideoOverlayButton {
    Q_OBJECT
  public:
    // initWithStyle:
    explicit TXHighFidelityVideoOverlayButton(long style, QWidget* parent = nullptr);

    long style() const override { return style_; }
    void setTarget_action(QObject* target, const QByteArray& action) override;
    QWidget* view() override { return this; }

    QObject* target() const { return target_; }
    void setTarget(QObject* target) { target_ = target; }
    QByteArray action() const { return action_; }
    void setAction(const QByteArray& action) { action_ = action; }

    platform::Button* button() const { return button_; }
    // Null unless the style is 0.
    platform::BackdropView* backdropView() const { return backdropView_; }

  public slots:
    void _playButtonActivate(QObject* sender);
    void _playButtonDeactivate(QObject* sender);
    void _playButtonTapped(QObject* sender);

  private:
    long style_;
    platform::Button* button_ = nullptr;
    platform::BackdropView* backdropView_ = nullptr;
    QPointer<QObject> target_;
    QByteArray action_;
};
