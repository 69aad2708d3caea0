#pragma once

#include <QAbstractButton>
#include <QHash>
#include <QImage>
#include <QList>
#include <functional>

namespace platform {

// A push button that shows one image per state (normal, highlighted) and
// reports the toolkit's control events. The highlighted state is the button's
// own while a press is down on it; without a highlighted image the normal one
// is drawn darkened. Keyboard: space or return presses and releases it inside.
// Main thread only.
class Button : public QAbstractButton {
    Q_OBJECT
  public:
    enum class State { Normal, Highlighted };
    enum class ControlEvent {
        TouchDown,
        TouchDragInside,  // each move of a press while over the button
        TouchDragOutside, // each move of a press while away from it
        TouchUpInside,
        TouchUpOutside,
        TouchCancel,
    };
    using Handler = std::function<void(Button* sender)>;

    explicit Button(const QRectF& frame = QRectF(), QWidget* parent = nullptr);

    void setImage(const QImage& image, State state);
    QImage imageForState(State state) const { return images_.value(state); }
    // The image drawn now.
    QImage currentImage() const;

    // Makes the button exactly the size of its normal image, in points.
    void sizeToFit();

    // Handlers run in the order added.
    void addHandler(ControlEvent event, Handler handler);
    // Presses and releases the button at once, as a click or the space key
    // does: TouchDown, then TouchUpInside (for keyboard shortcuts). Nothing
    // happens when it is disabled.
    void press();

    // When false, presses on the button never reach the tap recognisers of
    // its superviews (they do by default).
    bool passesTouchesToSuperviewRecognizers() const { return passes_; }
    void setPassesTouchesToSuperviewRecognizers(bool passes) { passes_ = passes; }

    QSize sizeHint() const override;

  protected:
    void paintEvent(QPaintEvent* event) override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;
    void keyReleaseEvent(QKeyEvent* event) override;
    void focusOutEvent(QFocusEvent* event) override;

  private:
    void send(ControlEvent event);

    QHash<State, QImage> images_;
    QHash<ControlEvent, QList<Handler>> handlers_;
    bool passes_ = true;
    bool tracking_ = false;
    bool keyDown_ = false;
};

} // namespace platform
