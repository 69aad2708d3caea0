#pragma once

#include "FakeWorld.h"
#include "platform/media/ImageGenerator.h"

#include <deque>
#include <mutex>

namespace fakes {

// An image generator that paints instead of decoding: each image is a plain
// picture of the video's size, scaled to fit the maximum size as the real one
// scales. It keeps the real contract: requests are served one after another,
// times in order, on a worker thread of GlobalQueue, each time with exactly
// one completion there; a time the world says cannot be decoded, or an asset
// without video, completes Failed. Every request is recorded in the world.
class FakeImageGenerator final : public platform::ImageGenerator,
                                 public std::enable_shared_from_this<FakeImageGenerator> {
  public:
    FakeImageGenerator(std::shared_ptr<platform::Asset> asset, std::shared_ptr<FakeWorld> world);

    std::shared_ptr<platform::Asset> asset() const override { return asset_; }
    QSizeF maximumSize() const override;
    void setMaximumSize(const QSizeF& size) override;
    bool appliesPreferredTrackTransform() const override;
    void setAppliesPreferredTrackTransform(bool applies) override;
    platform::MediaTime requestedTimeToleranceBefore() const override;
    platform::MediaTime requestedTimeToleranceAfter() const override;
    void setRequestedTimeToleranceBefore(const platform::MediaTime& tolerance) override;
    void setRequestedTimeToleranceAfter(const platform::MediaTime& tolerance) override;
    void generateImagesAsynchronouslyForTimes_completionHandler(
        const QList<platform::MediaTime>& requestedTimes,
        platform::ImageGenerationHandler handler) override;
    void cancelAllImageGeneration() override;
    QImage copyImageAtTime_actualTime_error(const platform::MediaTime& requestedTime,
                                            platform::MediaTime* actualTime,
                                            platform::ErrorPtr* error) override;

  private:
    struct Request {
        QList<platform::MediaTime> times;
        platform::ImageGenerationHandler handler;
        std::uint64_t epoch; // cancelled when the epoch has moved on
    };
    void serve();
    QImage paint(const platform::MediaTime& time, QSizeF box, bool upright,
                 platform::ErrorPtr* error) const;

    const std::shared_ptr<platform::Asset> asset_;
    const std::shared_ptr<FakeWorld> world_;
    mutable std::mutex mutex_; // guards everything below
    QSizeF maximumSize_;
    bool applies_ = false;
    platform::MediaTime toleranceBefore_ = platform::MediaTime::positiveInfinity();
    platform::MediaTime toleranceAfter_ = platform::MediaTime::positiveInfinity();
    std::deque<Request> pending_;
    bool serving_ = false;
    std::uint64_t epoch_ = 0;
};

} // namespace fakes
