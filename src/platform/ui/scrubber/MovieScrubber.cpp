#include "platform/ui/scrubber/MovieScrubber.h"

#include "platform/ui/scrubber/MovieScrubberAccessible.h"

#include <QAccessible>
#include <QVariantAnimation>
#include <algorithm>
#include <cmath>
#include <limits>

namespace platform {

namespace {

// The frame's top and bottom bars are this thick; the thumbnails sit inside.
constexpr double kFrameThickness = 2.0;
// Below this the handles would be too thin to hit, whatever the inset.
constexpr double kMinimumHandleWidth = 6.0;
// Enough for any screen; guards against a degenerate aspect ratio.
constexpr int kMaximumThumbnails = 400;
constexpr int kEditingAnimationMs = 200;
constexpr int kZoomAnimationMs = 250;

} // namespace

MovieScrubber::MovieScrubber(QWidget* parent) : QWidget(parent) {
    // Before anything that raises an accessibility event: the first event
    // makes and caches this widget's interface for good.
    installMovieScrubberAccessibility();
    setFocusPolicy(Qt::StrongFocus);
    setAttribute(Qt::WA_AcceptTouchEvents);
    setMouseTracking(true); // for the resize cursor over the handles
    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Fixed);
    setAccessibleName(QStringLiteral("Movie scrubber"));

    zoomTimer_.setSingleShot(true);
    connect(&zoomTimer_, &QTimer::timeout, this, [this] { zoomIn(); });

    editingAnimation_ = new QVariantAnimation(this);
    editingAnimation_->setDuration(kEditingAnimationMs);
    editingAnimation_->setEasingCurve(QEasingCurve::OutCubic);
    connect(editingAnimation_, &QVariantAnimation::valueChanged, this, [this](const QVariant& v) {
        editingAppearance_ = v.toDouble();
        update();
    });

    zoomAnimation_ = new QVariantAnimation(this);
    zoomAnimation_->setDuration(kZoomAnimationMs);
    zoomAnimation_->setEasingCurve(QEasingCurve::InOutCubic);
    connect(zoomAnimation_, &QVariantAnimation::valueChanged, this, [this](const QVariant& v) {
        zoomProgress_ = v.toDouble();
        update();
    });
    connect(zoomAnimation_, &QVariantAnimation::finished, this, [this] {
        if (!timeline_.isZoomed()) {
            zoomProgress_ = 0.0;
            zoomed_ = {};
            update();
        }
    });
}

MovieScrubber::~MovieScrubber() = default;

void MovieScrubber::setDelegate(std::weak_ptr<MovieScrubberDelegate> delegate) {
    delegate_ = std::move(delegate);
}

void MovieScrubber::setDataSource(std::weak_ptr<MovieScrubberDataSource> dataSource) {
    dataSource_ = std::move(dataSource);
}

void MovieScrubber::reloadData() {
    // A gesture cannot survive a change of movie under the user's hand.
    endGesture();
    zoomAnimation_->stop();
    timeline_.unzoom();
    zoomProgress_ = 0.0;
    zoomed_ = {};

    double duration = std::numeric_limits<double>::quiet_NaN();
    float aspect = 1.0f;
    if (auto source = dataSource_.lock()) {
        duration = source->movieScrubberDuration(this);
        aspect = source->movieScrubberThumbnailAspectRatio(this);
    }
    aspectRatio_ = std::isfinite(aspect) && aspect > 0.0f ? aspect : 1.0f;

    const double previous = timeline_.duration();
    timeline_.setDuration(duration);
    if (!loaded_ || timeline_.duration() != previous)
        range_.reset(timeline_.duration());
    else
        range_.refit(timeline_.duration());
    loaded_ = true;

    overview_ = {};
    ++generation_;
    // Set the track directly: updateTrack would lay out a second time.
    const QRectF track = trackRect();
    timeline_.setTrack(track.left(), track.width());
    layoutThumbnails(false);
    update();
    notifyValueChanged();
}

void MovieScrubber::setThumbnailImage_forTimestamp(const QImage& image, double timestamp) {
    if (image.isNull())
        return;
    const bool shown = overview_.setImage(timestamp, image) | zoomed_.setImage(timestamp, image);
    if (shown)
        update();
}

void MovieScrubber::setValue(double seconds) {
    if (value_ == seconds || (std::isnan(value_) && std::isnan(seconds)))
        return;
    value_ = seconds;
    update();
    if (focusPart_ == Handle::Playhead)
        notifyValueChanged();
}

void MovieScrubber::setEditable(bool editable) {
    if (editable_ == editable)
        return;
    editable_ = editable;
    if (!editable_) {
        setEditing_animated(false, false);
        if (focusPart_ != Handle::Playhead) {
            focusPart_ = Handle::Playhead;
            notifyValueChanged();
        }
    }
    update();
}

void MovieScrubber::setEditing_animated(bool editing, bool animated) {
    if (editing && !editable_)
        return;
    if (editing_ == editing)
        return;
    if (!editing && (gesture_ == Gesture::Start || gesture_ == Gesture::End))
        endGesture();
    editing_ = editing;
    animateEditingAppearance(animated);
}

void MovieScrubber::setMinimumTrimLength(double seconds) {
    range_.setMinimumLength(seconds);
    update();
}

void MovieScrubber::setStartValue(double seconds) {
    if (range_.setStart(seconds))
        update();
}

void MovieScrubber::setEndValue(double seconds) {
    if (range_.setEnd(seconds))
        update();
}

void MovieScrubber::setZoomDelay(double seconds) {
    zoomDelay_ = std::isfinite(seconds) && seconds > 0.0 ? seconds : 0.0;
}

void MovieScrubber::setZoomFactor(double factor) {
    zoomFactor_ = std::isfinite(factor) ? std::max(1.0, factor) : 1.0;
}

void MovieScrubber::setEdgeInset(float points) {
    const float inset = std::isfinite(points) ? std::max(0.0f, points) : 0.0f;
    if (inset == edgeInset_)
        return;
    edgeInset_ = inset;
    updateTrack();
    update();
}

void MovieScrubber::setFrameDuration(double seconds) {
    frameDuration_ = std::isfinite(seconds) && seconds > 0.0 ? seconds : 0.0;
}

void MovieScrubber::setTintColor(const QColor& color) {
    tintColor_ = color.isValid() ? color : QColor(255, 204, 0);
    update();
}

double MovieScrubber::positionForTime(double seconds) const {
    return drawingMapping().xForTime(seconds);
}

double MovieScrubber::timeAtPosition(double x) const {
    return timeline_.active().timeForX(x);
}

QSize MovieScrubber::sizeHint() const {
    return {480, 38};
}

QSize MovieScrubber::minimumSizeHint() const {
    return {static_cast<int>(2 * handleWidth()) + 48, 30};
}

void MovieScrubber::resizeEvent(QResizeEvent* event) {
    QWidget::resizeEvent(event);
    updateTrack();
}

QRectF MovieScrubber::trackRect() const {
    const double inset = edgeInset_;
    return QRectF(inset, kFrameThickness, std::max(0.0, width() - 2 * inset),
                  std::max(0.0, height() - 2 * kFrameThickness));
}

double MovieScrubber::handleWidth() const {
    return std::max<double>(edgeInset_, kMinimumHandleWidth);
}

double MovieScrubber::thumbnailWidth() const {
    return std::max(4.0, trackRect().height() * aspectRatio_);
}

int MovieScrubber::thumbnailCount(double pixels) const {
    return std::clamp(static_cast<int>(std::ceil(pixels / thumbnailWidth())), 1,
                      kMaximumThumbnails);
}

void MovieScrubber::updateTrack() {
    const QRectF track = trackRect();
    if (track.left() == timeline_.trackLeft() && track.width() == timeline_.trackWidth())
        return;
    if (timeline_.isZoomed() || zoomProgress_ > 0.0) {
        // The zoomed view was made for the old track; drop it rather than
        // let the held handle jump under the pointer.
        zoomAnimation_->stop();
        zoomProgress_ = 0.0;
        zoomed_ = {};
    }
    timeline_.setTrack(track.left(), track.width());
    if (loaded_)
        layoutThumbnails(true);
}

void MovieScrubber::layoutThumbnails(bool keepImages) {
    if (!timeline_.hasMovie() || timeline_.trackWidth() <= 0.0) {
        overview_ = {};
        return;
    }
    const double duration = timeline_.duration();
    const int count = thumbnailCount(timeline_.trackWidth());
    if (keepImages && overview_.covers(0.0, duration, count))
        return;

    auto source = dataSource_.lock();
    if (!source)
        return;
    const unsigned generation = ++generation_;
    const QList<double> stamps = source->movieScrubber_evenlySpacedTimestamps_startingAt_endingAt(
        this, count, 0.0, duration);
    if (generation != generation_)
        return; // the data source reloaded us meanwhile; that reload laid out anew
    ThumbnailStrip strip(0.0, duration, count, stamps);
    if (keepImages)
        strip.adoptImages(overview_);
    overview_ = std::move(strip);
    update();
    requestThumbnails(overview_, overview_.timestamps());
}

void MovieScrubber::requestThumbnails(const ThumbnailStrip& strip, const QList<double>& stamps) {
    auto source = dataSource_.lock();
    if (!source)
        return;
    const unsigned generation = generation_;
    // Work on a copy: an answer given from inside a request changes the strip.
    std::vector<bool> missing;
    for (const ThumbnailSlot& slot : strip.entries())
        missing.push_back(slot.image.isNull());
    for (qsizetype i = 0; i < stamps.size(); ++i) {
        if (generation != generation_)
            return;
        const bool repeated = i > 0 && stamps[i] == stamps[i - 1];
        if (missing[static_cast<size_t>(i)] && !repeated)
            source->movieScrubber_requestThumbnailImageForTimestamp(this, stamps[i]);
    }
}

TimelineMapping MovieScrubber::drawingMapping() const {
    const TimelineMapping overview = timeline_.overview();
    if (zoomProgress_ <= 0.0)
        return overview;
    return TimelineMapping::blend(overview, timeline_.zoomMapping(), zoomProgress_);
}

void MovieScrubber::animateEditingAppearance(bool animated) {
    const double target = editing_ ? 1.0 : 0.0;
    editingAnimation_->stop();
    if (!animated || !isVisible()) {
        editingAppearance_ = target;
        update();
        return;
    }
    editingAnimation_->setStartValue(editingAppearance_);
    editingAnimation_->setEndValue(target);
    editingAnimation_->start();
}

void MovieScrubber::animateZoom(double target) {
    zoomAnimation_->stop();
    if (!isVisible()) {
        zoomProgress_ = target;
        if (target <= 0.0)
            zoomed_ = {};
        update();
        return;
    }
    zoomAnimation_->setStartValue(zoomProgress_);
    zoomAnimation_->setEndValue(target);
    zoomAnimation_->start();
}

void MovieScrubber::notifyValueChanged() {
    if (QAccessible::isActive()) {
        QAccessibleValueChangeEvent event(this, accessibleValueText());
        QAccessible::updateAccessibility(&event);
    }
}

QString MovieScrubber::accessibleValueText() const {
    double seconds = value_;
    QString part = QStringLiteral("Playhead");
    if (focusPart_ == Handle::Start) {
        seconds = range_.start();
        part = QStringLiteral("Trim start");
    } else if (focusPart_ == Handle::End) {
        seconds = range_.end();
        part = QStringLiteral("Trim end");
    }
    if (!std::isfinite(seconds))
        return part;
    const double clamped = std::max(0.0, seconds);
    const int minutes = static_cast<int>(clamped / 60.0);
    const double rest = clamped - minutes * 60.0;
    return QStringLiteral("%1 %2:%3").arg(part).arg(minutes).arg(rest, 5, 'f', 2, QLatin1Char('0'));
}

} // namespace platform
