#include "DecodingImageGenerator.h"

#include "FFmpegHandles.h"
#include "VideoFrameReader.h"
#include "platform/runtime/GlobalQueue.h"

#include <cmath>

namespace platform {
namespace {

int boxSide(double side) {
    return std::isfinite(side) && side >= 1 ? int(std::lround(side)) : 0;
}

bool isExact(const MediaTime& before, const MediaTime& after) {
    // Anything short of "any distance" asks for the frame at the time; we
    // do not search for keyframes within a bounded window.
    return before.isNumeric() || after.isNumeric();
}

} // namespace

Implementation<ImageGenerator::Maker>& ImageGenerator::implementation() {
    static Implementation<Maker> chosen(
        [](std::shared_ptr<Asset> asset) -> std::shared_ptr<ImageGenerator> {
            return std::make_shared<DecodingImageGenerator>(std::move(asset));
        });
    return chosen;
}

std::shared_ptr<ImageGenerator>
ImageGenerator::imageGeneratorWithAsset(std::shared_ptr<Asset> asset) {
    return implementation().make(std::move(asset));
}

DecodingImageGenerator::DecodingImageGenerator(std::shared_ptr<Asset> asset)
    : asset_(std::move(asset)) {}

DecodingImageGenerator::~DecodingImageGenerator() = default;

QSizeF DecodingImageGenerator::maximumSize() const {
    std::lock_guard lock(mutex_);
    return settings_.maximumSize;
}

void DecodingImageGenerator::setMaximumSize(const QSizeF& size) {
    std::lock_guard lock(mutex_);
    settings_.maximumSize = size;
}

bool DecodingImageGenerator::appliesPreferredTrackTransform() const {
    std::lock_guard lock(mutex_);
    return settings_.appliesTransform;
}

void DecodingImageGenerator::setAppliesPreferredTrackTransform(bool applies) {
    std::lock_guard lock(mutex_);
    settings_.appliesTransform = applies;
}

MediaTime DecodingImageGenerator::requestedTimeToleranceBefore() const {
    std::lock_guard lock(mutex_);
    return settings_.toleranceBefore;
}

MediaTime DecodingImageGenerator::requestedTimeToleranceAfter() const {
    std::lock_guard lock(mutex_);
    return settings_.toleranceAfter;
}

void DecodingImageGenerator::setRequestedTimeToleranceBefore(const MediaTime& tolerance) {
    std::lock_guard lock(mutex_);
    settings_.toleranceBefore = tolerance;
}

void DecodingImageGenerator::setRequestedTimeToleranceAfter(const MediaTime& tolerance) {
    std::lock_guard lock(mutex_);
    settings_.toleranceAfter = tolerance;
}

void DecodingImageGenerator::generateImagesAsynchronouslyForTimes_completionHandler(
    const QList<MediaTime>& requestedTimes, ImageGenerationHandler handler) {
    if (!handler || requestedTimes.isEmpty())
        return;
    bool startWorker = false;
    {
        std::lock_guard lock(mutex_);
        for (const MediaTime& time : requestedTimes)
            queue_.push_back({time, handler, generation_, settings_});
        startWorker = !draining_;
        draining_ = true;
    }
    if (startWorker) {
        auto self = shared_from_this();
        GlobalQueue::async(QueuePriority::Default, [self] { self->drainQueue(); });
    }
}

void DecodingImageGenerator::cancelAllImageGeneration() {
    std::lock_guard lock(mutex_);
    ++generation_;
}

void DecodingImageGenerator::drainQueue() {
    for (;;) {
        Request request;
        bool cancelled = false;
        {
            std::lock_guard lock(mutex_);
            if (queue_.empty()) {
                draining_ = false;
                return;
            }
            request = std::move(queue_.front());
            queue_.pop_front();
            cancelled = request.generation != generation_;
        }
        if (cancelled) {
            request.handler(request.time, QImage(), MediaTime::invalid(),
                            ImageGeneratorResult::Cancelled, nullptr);
            continue;
        }
        MediaTime actual;
        ErrorPtr error;
        QImage image = generate(request.time, request.settings, &actual, &error);
        request.handler(request.time, image, actual,
                        image.isNull() ? ImageGeneratorResult::Failed
                                       : ImageGeneratorResult::Succeeded,
                        image.isNull() ? error : nullptr);
    }
}

QImage DecodingImageGenerator::copyImageAtTime_actualTime_error(const MediaTime& requestedTime,
                                                                MediaTime* actualTime,
                                                                ErrorPtr* error) {
    Settings settings;
    {
        std::lock_guard lock(mutex_);
        settings = settings_;
    }
    MediaTime actual;
    ErrorPtr failure;
    QImage image = generate(requestedTime, settings, &actual, &failure);
    if (actualTime)
        *actualTime = actual;
    setError(error, failure);
    return image;
}

QImage DecodingImageGenerator::generate(const MediaTime& time, const Settings& settings,
                                        MediaTime* actualTime, ErrorPtr* error) {
    *actualTime = MediaTime::invalid();
    const QList<AssetTrack> video =
        asset_ ? asset_->tracksWithMediaType(MediaType::Video) : QList<AssetTrack>();
    if (video.isEmpty()) {
        *error = asset_ && asset_->error()
                     ? asset_->error()
                     : makeError(AVERROR_STREAM_NOT_FOUND, mediaErrorDomain(),
                                 QStringLiteral("the asset has no video track"));
        return {};
    }
    std::lock_guard lock(readerMutex_);
    if (!reader_) {
        reader_ = VideoFrameReader::open(asset_->readablePath(), error);
        if (!reader_)
            return {};
    }
    // The box applies to the upright picture when the transform is applied,
    // so turn it into the coded orientation for the decoder's scaler.
    const QTransform turn =
        settings.appliesTransform ? video.first().preferredTransform : QTransform();
    const bool swapsAxes = std::abs(turn.m12()) > std::abs(turn.m11());
    QSize box(boxSide(settings.maximumSize.width()), boxSide(settings.maximumSize.height()));
    if (swapsAxes)
        box.transpose();
    const VideoFrameReader::Frame frame = reader_->frameAt(
        time, isExact(settings.toleranceBefore, settings.toleranceAfter), box, error);
    if (frame.image.isNull())
        return {};
    *actualTime = frame.time;
    if (!settings.appliesTransform || turn.isIdentity())
        return frame.image;
    const QTransform linear(turn.m11(), turn.m12(), turn.m21(), turn.m22(), 0, 0);
    return frame.image.transformed(linear);
}

} // namespace platform
