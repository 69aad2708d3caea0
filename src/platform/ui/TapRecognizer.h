#pragma once

#include <QObject>
#include <QPointF>
#include <QPointer>
#include <QWidget>
#include <functional>

namespace platform {

// A single-tap recogniser: a press and release of the primary button (or a
// touch, which Qt turns into one) on its view or any view inside it, with
// little movement in between. Presses that land on a Button that does not
// pass touches to its superviews' recognisers are left alone. The recogniser
// belongs to its view (a Qt child) and goes with it. Main thread only.
class TapRecognizer : public QObject {
    Q_OBJECT
  public:
    using Action = std::function<void(TapRecognizer* recognizer)>;

    // Attaches to `view` at once.
    TapRecognizer(QWidget* view, Action action);
    ~TapRecognizer() override;

    QWidget* view() const { return view_; }
    bool isEnabled() const { return enabled_; }
    void setEnabled(bool enabled) { enabled_ = enabled; }
    // Where the last tap was, in the view's coordinates.
    QPointF locationInView() const { return location_; }

    // Movement beyond this many points between press and release is a drag,
    // not a tap.
    static constexpr qreal AllowableMovement = 10.0;

  protected:
    bool eventFilter(QObject* watched, QEvent* event) override;

  private:
    bool withinView(QWidget* target) const;
    bool blockedByButton(QWidget* target) const;

    QPointer<QWidget> view_;
    Action action_;
    bool enabled_ = true;
    bool tracking_ = false;
    QPointF pressGlobal_;
    QPointF location_;
};

} // namespace platform
