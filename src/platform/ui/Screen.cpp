#include "platform/ui/Screen.h"

#include "platform/runtime/MainQueue.h"

#include <QGuiApplication>
#include <QScreen>
#include <atomic>

namespace platform {

namespace {
QPointer<QWidget>& mainWindowSlot() {
    static QPointer<QWidget> window;
    return window;
}

// The scale last read on the main thread, for readers on other threads.
std::atomic<double> lastScale{1.0};
} // namespace

Screen Screen::mainScreen() {
    return Screen(mainWindowSlot());
}

void Screen::setMainWindow(QWidget* window) {
    mainWindowSlot() = window;
}

QWidget* Screen::mainWindow() {
    return mainWindowSlot();
}

QRectF Screen::bounds() const {
    if (window_)
        return QRectF(QPointF(0, 0), QSizeF(window_->size()));
    if (QScreen* screen = QGuiApplication::primaryScreen())
        return QRectF(QPointF(0, 0), QSizeF(screen->availableGeometry().size()));
    return {};
}

qreal Screen::scale() const {
    // Widgets and screens may only be asked on the main thread.
    if (!MainQueue::isCurrent())
        return lastScale.load();
    qreal scale = 1.0;
    if (window_)
        scale = window_->devicePixelRatioF();
    else if (QScreen* screen = QGuiApplication::primaryScreen())
        scale = screen->devicePixelRatio();
    lastScale.store(scale);
    return scale;
}

} // namespace platform
