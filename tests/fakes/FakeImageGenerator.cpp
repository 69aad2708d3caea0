#include "FakeImageGenerator.h"

#include "platform/runtime/GlobalQueue.h"

#include <cmath>

using namespace platform;

namespace fakes {

namespace {
const int kInvalidData = -1094995529; // FFmpeg's AVERROR_INVALIDDATA

bool constrains(qreal side) {
    return std::isfinite(side) && side > 0;
}
} // namespace

FakeImageGenerator::FakeImageGenerator(std::shared_ptr<Asset> asset,
                                       std::shared_ptr<FakeWorld> world)
    : asset_(std::move(asset)), world_(std::move(world)) {}

QSizeF FakeImageGenerator::maximumSize() const {
    std::lock_guard lock(mutex_);
    return maximumSize_;
}
void FakeImageGenerator::setMaximumSize(const QSizeF& size) {
    std::lock_guard lock(mutex_);
    maximumSize_ = size;
}
bool FakeImageGenerator::appliesPreferredTrackTransform() const {
    std::lock_guard lock(mutex_);
    return applies_;
}
void FakeImageGenerator::setAppliesPreferredTrackTransform(bool applies) {
    std::lock_guard lock(mutex_);
    applies_ = applies;
}
MediaTime FakeImageGenerator::requestedTimeToleranceBefore() const {
    std::lock_guard lock(mutex_);
    return toleranceBefore_;
}
MediaTime FakeImageGenerator::requestedTimeToleranceAfter() const {
    std::lock_guard lock(mutex_);
    return toleranceAfter_;
}
void FakeImageGenerator::setRequestedTimeToleranceBefore(const MediaTime& tolerance) {
    std::lock_guard lock(mutex_);
    toleranceBefore_ = tolerance;
}
void FakeImageGenerator::setRequestedTimeToleranceAfter(const MediaTime& tolerance) {
    std::lock_guard lock(mutex_);
    toleranceAfter_ = tolerance;
}

void FakeImageGenerator::generateImagesAsynchronouslyForTimes_completionHandler(
    const QList<MediaTime>& requestedTimes, ImageGenerationHandler handler) {
    std::lock_guard lock(mutex_);
    for (const MediaTime& time : requestedTimes)
        world_->recordGeneration(time.seconds(), maximumSize_);
    pending_.push_back({requestedTimes, std::move(handler), epoch_});
    if (serving_)
        return;
    serving_ = true;
    // One worker job serves the queue in order; it holds the generator, so
    // pending work completes even when the generator is let go.
    GlobalQueue::async(QueuePriority::Default, [self = shared_from_this()] { self->serve(); });
}

void FakeImageGenerator::serve() {
    for (;;) {
        std::unique_lock lock(mutex_);
        if (pending_.empty()) {
            serving_ = false;
            return;
        }
        Request request = std::move(pending_.front());
        pending_.pop_front();
        lock.unlock();
        for (const MediaTime& time : request.times) {
            lock.lock();
            const bool cancelled = request.epoch != epoch_;
            const QSizeF box = maximumSize_;
            const bool upright = applies_;
            lock.unlock();
            if (cancelled) {
                request.handler(time, QImage(), MediaTime::invalid(),
                                ImageGeneratorResult::Cancelled, nullptr);
                continue;
            }
            ErrorPtr error;
            const QImage image = paint(time, box, upright, &error);
            request.handler(time, image, image.isNull() ? MediaTime::invalid() : time,
                            image.isNull() ? ImageGeneratorResult::Failed
                                           : ImageGeneratorResult::Succeeded,
                            error);
        }
    }
}

void FakeImageGenerator::cancelAllImageGeneration() {
    std::lock_guard lock(mutex_);
    ++epoch_;
}

QImage FakeImageGenerator::copyImageAtTime_actualTime_error(const MediaTime& requestedTime,
                                                            MediaTime* actualTime,
                                                            ErrorPtr* error) {
    ErrorPtr failure;
    const QImage image =
        paint(requestedTime, maximumSize(), appliesPreferredTrackTransform(), &failure);
    if (actualTime)
        *actualTime = image.isNull() ? MediaTime::invalid() : requestedTime;
    setError(error, failure);
    return image;
}

QImage FakeImageGenerator::paint(const MediaTime& time, QSizeF box, bool upright,
                                 ErrorPtr* error) const {
    const QList<AssetTrack> video = asset_->tracksWithMediaType(MediaType::Video);
    if (video.isEmpty() || !time.isNumeric() || world_->generationFailsAt(time.seconds())) {
        setError(error, makeError(kInvalidData, mediaErrorDomain(),
                                  QStringLiteral("no frame at %1").arg(time.seconds())));
        return {};
    }
    QSizeF size = video.first().naturalSize;
    if (upright)
        size = video.first().preferredTransform.mapRect(QRectF(QPointF(), size)).size();
    if (constrains(box.width()) && size.width() > box.width())
        size *= box.width() / size.width();
    if (constrains(box.height()) && size.height() > box.height())
        size *= box.height() / size.height();
    QImage image(size.toSize().expandedTo(QSize(1, 1)), QImage::Format_RGB32);
    // A shade per second, so pictures of different times differ.
    image.fill(QColor::fromHsv(int(time.seconds() * 36) % 360, 200, 200));
    return image;
}

} // namespace fakes
