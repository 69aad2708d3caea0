#pragma once

#include <QPointer>
#include <QRectF>
#include <QWidget>

namespace platform {

// The main screen as the system sees it: the window the extension is shown
// in. Its bounds are that window's (origin 0,0, size in points) and its scale
// the device pixel ratio of the screen the window is on. Before a window is
// set, the primary screen's available area and ratio stand in. Main thread
// only, except scale(), which on another thread gives the value last read on
// the main thread (1.0 before any).
class Screen {
  public:
    static Screen mainScreen();
    // The window that is the main screen from now on (weakly held).
    static void setMainWindow(QWidget* window);
    static QWidget* mainWindow();

    QRectF bounds() const;
    qreal scale() const;

  private:
    explicit Screen(QWidget* window) : window_(window) {}
    QPointer<QWidget> window_;
};

} // namespace platform
