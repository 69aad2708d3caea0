#include "platform/ui/ActivityIndicator.h"

#include <QPainter>
#include <QtMath>

namespace platform {

namespace {
constexpr int kSpokes = 12;
}

ActivityIndicator::ActivityIndicator(Style style, QWidget* parent)
    : View(QRectF(), parent), style_(style) {
    const qreal side = style == Style::WhiteLarge ? 37.0 : 20.0;
    setFrame(QRectF(0, 0, side, side));
    setAccessibleName(tr("In progress"));
    timer_.setInterval(1000 / kSpokes);
    connect(&timer_, &QTimer::timeout, this, [this] {
        phase_ = (phase_ + 1) % kSpokes;
        update();
    });
    setUserInteractionEnabled(false);
    View::setHiddenOf(this, hidesWhenStopped_);
}

void ActivityIndicator::startAnimating() {
    if (!timer_.isActive())
        timer_.start();
    if (hidesWhenStopped_)
        View::setHiddenOf(this, false);
}

void ActivityIndicator::stopAnimating() {
    timer_.stop();
    if (hidesWhenStopped_)
        View::setHiddenOf(this, true);
    update();
}

void ActivityIndicator::setHidesWhenStopped(bool hides) {
    hidesWhenStopped_ = hides;
    if (hides && !isAnimating())
        View::setHiddenOf(this, true);
}

void ActivityIndicator::paintEvent(QPaintEvent* event) {
    View::paintEvent(event);
    QPainter painter(this);
    painter.setRenderHint(QPainter::Antialiasing);
    const QRectF area = bounds();
    const qreal radius = std::min(area.width(), area.height()) / 2.0;
    const QColor base = style_ == Style::Gray ? QColor(110, 110, 110) : QColor(Qt::white);
    QPen pen(base, std::max(2.0, radius * 0.22), Qt::SolidLine, Qt::RoundCap);
    painter.translate(area.center());
    for (int i = 0; i < kSpokes; ++i) {
        // The spokes fade behind the bright one, which makes the turning.
        const int age = (phase_ - i + kSpokes) % kSpokes;
        QColor colour = base;
        colour.setAlphaF(float(1.0 - 0.75 * age / (kSpokes - 1)));
        pen.setColor(colour);
        painter.setPen(pen);
        const qreal angle = 2.0 * M_PI * i / kSpokes - M_PI / 2.0;
        const QPointF direction(std::cos(angle), std::sin(angle));
        painter.drawLine(direction * radius * 0.45, direction * radius * 0.9);
    }
}

} // namespace platform
