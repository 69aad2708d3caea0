// Drawing. Everything is in device-independent pixels; QPainter scales to the
// screen, and edges between thumbnails are snapped to device pixels so the
// strip has no seams at fractional scale factors.
#include "platform/ui/scrubber/MovieScrubber.h"

#include <QPainter>
#include <QPainterPath>
#include <algorithm>
#include <cmath>

namespace platform {

namespace {

constexpr double kStripRadius = 4.0;
constexpr double kFrameRadius = 5.0;
const QColor kStripColor(34, 34, 36);
const QColor kRestingHandleColor(255, 255, 255, 90);

// Puts an edge on the device pixel grid, so it is drawn sharp.
double snapToDevice(double x, double scale) {
    return std::round(x * scale) / scale;
}

QColor mix(const QColor& a, const QColor& b, double t) {
    const double u = std::clamp(t, 0.0, 1.0);
    auto lerp = [u](int x, int y) { return static_cast<int>(std::lround(x + (y - x) * u)); };
    return QColor(lerp(a.red(), b.red()), lerp(a.green(), b.green()), lerp(a.blue(), b.blue()),
                  lerp(a.alpha(), b.alpha()));
}

// The part of `image` that fills `target` without distortion (centre crop).
QRectF fillSource(const QImage& image, const QRectF& target) {
    const double w = image.width();
    const double h = image.height();
    if (target.height() <= 0 || h <= 0)
        return QRectF(0, 0, w, h);
    const double want = target.width() / target.height();
    if (w / h > want) {
        const double cropped = h * want;
        return QRectF((w - cropped) / 2, 0, cropped, h);
    }
    const double cropped = w / want;
    return QRectF(0, (h - cropped) / 2, w, cropped);
}

void drawChevron(QPainter& painter, const QPointF& centre, double height, bool pointsLeft,
                 const QColor& color) {
    const double half = height / 2;
    const double depth = height * 0.35;
    const double dir = pointsLeft ? -1.0 : 1.0;
    QPainterPath path;
    path.moveTo(centre.x() - dir * depth / 2, centre.y() - half);
    path.lineTo(centre.x() + dir * depth / 2, centre.y());
    path.lineTo(centre.x() - dir * depth / 2, centre.y() + half);
    QPen pen(color, 1.8);
    pen.setCapStyle(Qt::RoundCap);
    pen.setJoinStyle(Qt::RoundJoin);
    painter.strokePath(path, pen);
}

} // namespace

void MovieScrubber::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.setRenderHint(QPainter::SmoothPixmapTransform);

    const QRectF track = trackRect();
    if (track.width() <= 0 || track.height() <= 0)
        return;
    QPainterPath strip;
    strip.addRoundedRect(track, kStripRadius, kStripRadius);
    painter.fillPath(strip, kStripColor);

    const TimelineMapping map = drawingMapping();
    if (map.isUsable()) {
        painter.save();
        painter.setClipPath(strip);
        paintThumbnails(painter, track, map);
        painter.restore();
    }
    painter.setPen(QPen(QColor(255, 255, 255, 36), 1.0));
    painter.setBrush(Qt::NoBrush);
    painter.drawRoundedRect(track.adjusted(0.5, 0.5, -0.5, -0.5), kStripRadius, kStripRadius);
    if (!map.isUsable())
        return;
    if (editable_)
        paintTrimFrame(painter, track, map);
    paintPlayhead(painter, track, map);
    if (hasFocus())
        paintFocus(painter, track, map);
}

void MovieScrubber::paintThumbnails(QPainter& painter, const QRectF& track,
                                    const TimelineMapping& map) const {
    const double scale = devicePixelRatioF();
    auto snap = [scale](double x) { return snapToDevice(x, scale); };
    auto paintStrip = [&](const ThumbnailStrip& thumbnails) {
        for (const ThumbnailSlot& slot : thumbnails.entries()) {
            if (slot.image.isNull())
                continue;
            const double left = snap(map.xForTime(slot.start));
            const double right = snap(map.xForTime(slot.end));
            if (right <= track.left() || left >= track.right() || right <= left)
                continue;
            const QRectF target(left, track.top(), right - left, track.height());
            painter.drawImage(target, slot.image, fillSource(slot.image, target));
        }
    };
    // While zoomed, the stretched overview fills in until the closer
    // thumbnails arrive.
    paintStrip(overview_);
    if (zoomProgress_ > 0.0)
        paintStrip(zoomed_);

    if (editable_) {
        // Outside the trim range the movie is shaded: lightly at rest when a
        // range is chosen, more while editing.
        const double resting = range_.isWholeMovie() ? 0.0 : 0.35;
        const double shade = resting + (0.6 - resting) * editingAppearance_;
        if (shade > 0.0) {
            const QColor dim(0, 0, 0, static_cast<int>(std::lround(255 * shade)));
            const double xs = snap(map.xForTime(range_.start()));
            const double xe = snap(map.xForTime(range_.end()));
            painter.fillRect(QRectF(QPointF(track.left(), track.top()),
                                    QPointF(std::max(track.left(), xs), track.bottom())),
                             dim);
            painter.fillRect(QRectF(QPointF(std::min(track.right(), xe), track.top()),
                                    QPointF(track.right(), track.bottom())),
                             dim);
        }
    }
}

void MovieScrubber::paintTrimFrame(QPainter& painter, const QRectF& track,
                                   const TimelineMapping& map) const {
    const double scale = devicePixelRatioF();
    const double width = handleWidth();
    const double xs = snapToDevice(map.xForTime(range_.start()), scale);
    const double xe = snapToDevice(map.xForTime(range_.end()), scale);
    const QRectF outer(QPointF(xs - width, 0.0), QPointF(xe + width, height()));
    const QRectF between(QPointF(xs, 0.0), QPointF(xe, height()));
    const QRectF inner(QPointF(xs, track.top()), QPointF(xe, track.bottom()));

    QPainterPath frame;
    frame.addRoundedRect(outer, kFrameRadius, kFrameRadius);
    QPainterPath middle;
    middle.addRect(between);
    QPainterPath window;
    window.addRoundedRect(inner, 1.5, 1.5);

    const QColor color = mix(kRestingHandleColor, tintColor_, editingAppearance_);
    painter.fillPath(frame.subtracted(middle), color);
    // The top and bottom bars belong to the editing look only.
    QColor bars = color;
    bars.setAlphaF(static_cast<float>(color.alphaF() * editingAppearance_));
    painter.fillPath(frame.intersected(middle).subtracted(window), bars);

    const QColor glyph = mix(QColor(255, 255, 255, 220), QColor(0, 0, 0, 170), editingAppearance_);
    const double glyphHeight = std::min(12.0, height() * 0.32);
    drawChevron(painter, QPointF(xs - width / 2, height() / 2.0), glyphHeight, true, glyph);
    drawChevron(painter, QPointF(xe + width / 2, height() / 2.0), glyphHeight, false, glyph);
}

void MovieScrubber::paintPlayhead(QPainter& painter, const QRectF&,
                                  const TimelineMapping& map) const {
    if (!std::isfinite(value_))
        return;
    // A white bar in a dark rim, both on the pixel grid: it reads over light
    // and dark pictures alike and stays sharp at any scale.
    const double left =
        snapToDevice(map.xForTime(timeline_.clampToMovie(value_)) - 1.5, devicePixelRatioF());
    painter.setPen(Qt::NoPen);
    painter.setBrush(QColor(0, 0, 0, 110));
    painter.drawRoundedRect(QRectF(left - 1.0, 0.0, 5.0, height()), 2.0, 2.0);
    painter.setBrush(Qt::white);
    painter.drawRoundedRect(QRectF(left, 0.5, 3.0, height() - 1.0), 1.5, 1.5);
}

void MovieScrubber::paintFocus(QPainter& painter, const QRectF&, const TimelineMapping& map) const {
    QRectF ring;
    switch (focusPart_) {
    case Handle::Playhead:
        if (!std::isfinite(value_))
            return;
        ring = QRectF(map.xForTime(timeline_.clampToMovie(value_)) - 4.0, 0.0, 8.0, height());
        break;
    case Handle::Start:
        ring = QRectF(map.xForTime(range_.start()) - handleWidth(), 0.0, handleWidth(), height());
        break;
    case Handle::End:
        ring = QRectF(map.xForTime(range_.end()), 0.0, handleWidth(), height());
        break;
    }
    painter.setPen(QPen(palette().color(QPalette::Highlight), 2.0));
    painter.setBrush(Qt::NoBrush);
    painter.drawRoundedRect(ring.adjusted(1.0, 1.0, -1.0, -1.0), 3.0, 3.0);
}

} // namespace platform
