#pragma once

#include "platform/ui/View.h"

#include <QTimer>

namespace platform {

// A spinning activity indicator. Styles as the toolkit numbers them:
// 0 large white (37 points), 1 white (20), 2 grey (20). A new indicator has
// its style's size at the origin and is not spinning; it is hidden while
// stopped when hidesWhenStopped (the default). Main thread only.
class ActivityIndicator : public View {
    Q_OBJECT
  public:
    enum class Style { WhiteLarge = 0, White = 1, Gray = 2 };

    explicit ActivityIndicator(Style style = Style::WhiteLarge, QWidget* parent = nullptr);

    Style style() const { return style_; }
    void startAnimating();
    void stopAnimating();
    bool isAnimating() const { return timer_.isActive(); }
    bool hidesWhenStopped() const { return hidesWhenStopped_; }
    void setHidesWhenStopped(bool hides);
    // The spoke drawn brightest, 0..11; it advances twelve times a second.
    int phase() const { return phase_; }

  protected:
    void paintEvent(QPaintEvent* event) override;

  private:
    Style style_;
    QTimer timer_;
    int phase_ = 0;
    bool hidesWhenStopped_ = true;
};

} // namespace platform
