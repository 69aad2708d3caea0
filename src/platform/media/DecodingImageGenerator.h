#pragma once

#include "platform/media/ImageGenerator.h"

#include <deque>
#include <mutex>

namespace platform {

class VideoFrameReader;

// The image generator on FFmpeg: one demuxer and decoder per generator, kept
// open between requests and used by one worker job at a time.
class DecodingImageGenerator final : public ImageGenerator,
                                     public std::enable_shared_from_this<DecodingImageGenerator> {
  public:
    explicit DecodingImageGenerator(std::shared_ptr<Asset> asset);
    ~DecodingImageGenerator() override;

    std::shared_ptr<Asset> asset() const override { return asset_; }
    QSizeF maximumSize() const override;
    void setMaximumSize(const QSizeF& size) override;
    bool appliesPreferredTrackTransform() const override;
    void setAppliesPreferredTrackTransform(bool applies) override;
    MediaTime requestedTimeToleranceBefore() const override;
    MediaTime requestedTimeToleranceAfter() const override;
    void setRequestedTimeToleranceBefore(const MediaTime& tolerance) override;
    void setRequestedTimeToleranceAfter(const MediaTime& tolerance) override;
    void
    generateImagesAsynchronouslyForTimes_completionHandler(const QList<MediaTime>& requestedTimes,
                                                           ImageGenerationHandler handler) override;
    void cancelAllImageGeneration() override;
    QImage copyImageAtTime_actualTime_error(const MediaTime& requestedTime, MediaTime* actualTime,
                                            ErrorPtr* error) override;

  private:
    struct Settings {
        QSizeF maximumSize;
        bool appliesTransform = false;
        MediaTime toleranceBefore = MediaTime::positiveInfinity();
        MediaTime toleranceAfter = MediaTime::positiveInfinity();
    };
    struct Request {
        MediaTime time;
        ImageGenerationHandler handler;
        std::uint64_t generation;
        Settings settings;
    };

    void drainQueue();
    QImage generate(const MediaTime& time, const Settings& settings, MediaTime* actualTime,
                    ErrorPtr* error);

    const std::shared_ptr<Asset> asset_;
    mutable std::mutex mutex_; // guards everything below
    Settings settings_;
    std::deque<Request> queue_;
    std::uint64_t generation_ = 0;
    bool draining_ = false;
    std::mutex readerMutex_; // one decode at a time
    std::unique_ptr<VideoFrameReader> reader_;
};

} // namespace platform
