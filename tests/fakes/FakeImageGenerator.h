#pragma once

#include "FakeWorld.h"
#include "platform/media/ImageGenerator.h"

#include <deque>
#include <mutex>

namespace fakes {

// An image generator that paints instead of decoding: each image is a plain
// picture of the video's size (turned when asked), a shade per second, scaled
// to fit the maximum size as the real one scales. It keeps the real contract:
// requests are served one after another, times in order, on a worker thread
// of GlobalQueue, each time with exactly one completion there; a time the
// world says cannot be decoded, or an asset without video, completes Failed.
// Every request is recorded in the world. Any thread.
class FakeImageGenerator final : public platform::ImageGenerator,
                                 public std::enable_shared_from_this<FakeImageGenerator> {
  public:
    FakeImageGenerator(std::shared_ptr<platform::Asset> asset, std::shared_ptr<FakeWorld> world)
        : asset_(std::move(asset)), world_(std::move(world)) {}

    std::shared_ptr<platform::Asset> asset() const override { return asset_; }
    QSizeF maximumSize() const override { return settings().box; }
    void setMaximumSize(const QSizeF& size) override {
        change([&](auto& s) { s.box = size; });
    }
    bool appliesPreferredTrackTransform() const override { return settings().upright; }
    void setAppliesPreferredTrackTransform(bool applies) override {
        change([&](auto& s) { s.upright = applies; });
    }
    platform::MediaTime requestedTimeToleranceBefore() const override { return settings().before; }
    platform::MediaTime requestedTimeToleranceAfter() const override { return settings().after; }
    void setRequestedTimeToleranceBefore(const platform::MediaTime& tolerance) override {
        change([&](auto& s) { s.before = tolerance; });
    }
    void setRequestedTimeToleranceAfter(const platform::MediaTime& tolerance) override {
        change([&](auto& s) { s.after = tolerance; });
    }
    void generateImagesAsynchronouslyForTimes_completionHandler(
        const QList<platform::MediaTime>& requestedTimes,
        platform::ImageGenerationHandler handler) override;
    void cancelAllImageGeneration() override {
        std::lock_guard lock(mutex_);
        ++epoch_;
    }
    QImage copyImageAtTime_actualTime_error(const platform::MediaTime& requestedTime,
                                            platform::MediaTime* actualTime,
                                            platform::ErrorPtr* error) override;

  private:
    struct Settings {
        QSizeF box;
        bool upright = false;
        platform::MediaTime before = platform::MediaTime::positiveInfinity();
        platform::MediaTime after = platform::MediaTime::positiveInfinity();
    };
    struct Request {
        QList<platform::MediaTime> times;
        platform::ImageGenerationHandler handler;
        Settings settings;   // as they were when the request came
        std::uint64_t epoch; // cancelled when the epoch has moved on
    };
    Settings settings() const {
        std::lock_guard lock(mutex_);
        return settings_;
    }
    template <typename Change> void change(Change&& change) {
        std::lock_guard lock(mutex_);
        change(settings_);
    }
    void serve();
    QImage paint(const platform::MediaTime& time, const Settings& settings,
                 platform::ErrorPtr* error) const;

    const std::shared_ptr<platform::Asset> asset_;
    const std::shared_ptr<FakeWorld> world_;
    mutable std::mutex mutex_; // guards everything below
    Settings settings_;
    std::deque<Request> pending_;
    bool serving_ = false;
    std::uint64_t epoch_ = 0;
};

} // namespace fakes
