#include "FakeImageGenerator.h"

#include "platform/runtime/GlobalQueue.h"

#include <cmath>

using namespace platform;

namespace fakes {

void FakeImageGenerator::generateImagesAsynchronouslyForTimes_completionHandler(
    const QList<MediaTime>& requestedTimes, ImageGenerationHandler handler) {
    std::lock_guard lock(mutex_);
    world_->change([&](FakeWorld::State& s) {
        for (const MediaTime& time : requestedTimes)
            s.generatedTimes.append(time.seconds());
        s.lastMaximumSize = settings_.box;
    });
    pending_.push_back({requestedTimes, std::move(handler), settings_, epoch_});
    // One worker job serves the queue in order; it holds the generator, so
    // pending work completes even when the generator is let go.
    if (!std::exchange(serving_, true))
        GlobalQueue::async(QueuePriority::Default, [self = shared_from_this()] { self->serve(); });
}

void FakeImageGenerator::serve() {
    std::unique_lock lock(mutex_);
    while (!pending_.empty()) {
        Request request = std::move(pending_.front());
        pending_.pop_front();
        for (const MediaTime& time : request.times) {
            const bool cancelled = request.epoch != epoch_;
            lock.unlock();
            ErrorPtr error;
            const QImage image = cancelled ? QImage() : paint(time, request.settings, &error);
            const auto result = cancelled        ? ImageGeneratorResult::Cancelled
                                : image.isNull() ? ImageGeneratorResult::Failed
                                                 : ImageGeneratorResult::Succeeded;
            request.handler(time, image, image.isNull() ? MediaTime::invalid() : time, result,
                            error);
            lock.lock();
        }
    }
    serving_ = false;
}

QImage FakeImageGenerator::copyImageAtTime_actualTime_error(const MediaTime& requestedTime,
                                                            MediaTime* actualTime,
                                                            ErrorPtr* error) {
    ErrorPtr failure;
    const QImage image = paint(requestedTime, settings(), &failure);
    if (actualTime)
        *actualTime = image.isNull() ? MediaTime::invalid() : requestedTime;
    setError(error, failure);
    return image;
}

QImage FakeImageGenerator::paint(const MediaTime& time, const Settings& settings,
                                 ErrorPtr* error) const {
    const QList<AssetTrack> video = asset_->tracksWithMediaType(MediaType::Video);
    if (video.isEmpty() || !time.isNumeric() ||
        world_->state().failingTimes.contains(time.seconds())) {
        const int invalidData = -1094995529; // FFmpeg's AVERROR_INVALIDDATA
        setError(error, makeError(invalidData, mediaErrorDomain(),
                                  QStringLiteral("no frame at %1").arg(time.seconds())));
        return {};
    }
    QSizeF size = video.first().naturalSize;
    if (settings.upright)
        size = video.first().preferredTransform.mapRect(QRectF(QPointF(), size)).size();
    const auto fit = [&size](qreal side, qreal own) {
        if (std::isfinite(side) && side > 0 && own > side)
            size *= side / own;
    };
    fit(settings.box.width(), size.width());
    fit(settings.box.height(), size.height());
    QImage image(size.toSize().expandedTo(QSize(1, 1)), QImage::Format_RGB32);
    image.fill(QColor::fromHsv(int(time.seconds() * 36) % 360, 200, 200));
    return image;
}

} // namespace fakes
