#pragma once

#include "platform/ui/View.h"

#include <QPointer>

namespace platform {

class ViewController;

// Holds a presented controller's root view inside the presenter's window: it
// covers the window's content and keeps covering it as the window resizes.
// Full-screen styles fill it with the presented view; a popover is a panel
// of the controller's preferred size beside its toolbar item, and a press
// outside the panel dismisses it. Made and removed by ViewController.
class PresentationContainer : public View {
    Q_OBJECT
  public:
    PresentationContainer(QWidget* host, ViewController* presented);

    // The widget a presentation covers: the window's content area.
    static QWidget* hostFor(QWidget* view);
    // Where the popover panel goes, in the container's coordinates.
    QRectF panelFrame() const;

  protected:
    void layoutSubviews() override;
    void mousePressEvent(QMouseEvent* event) override;
    void paintEvent(QPaintEvent* event) override;
    bool eventFilter(QObject* watched, QEvent* event) override;

  private:
    bool isPopover() const;
    QPointer<QWidget> host_;
    QPointer<ViewController> presented_;
};

} // namespace platform
