#pragma once

#include "platform/media/Asset.h"
#include "platform/media/MediaTime.h"
#include "platform/runtime/Error.h"
#include "platform/runtime/Implementation.h"

#include <QImage>
#include <QList>
#include <QSizeF>

#include <functional>
#include <memory>

namespace platform {

enum class ImageGeneratorResult { Succeeded = 0, Failed = 1, Cancelled = 2 };

// One completion per requested time: the time as requested, the image (null
// unless Succeeded), the time of the frame it shows, the result, and the
// error (null unless Failed).
using ImageGenerationHandler =
    std::function<void(MediaTime requestedTime, QImage image, MediaTime actualTime,
                       ImageGeneratorResult result, ErrorPtr error)>;

// Makes still images of an asset's first video track.
//
// Settings are read when a request starts; change them before requesting.
// Requests are served one after another, times in the order given, on a
// worker thread; every requested time gets exactly one completion, on that
// worker thread, even when the generator is released first (the pending work
// keeps what it needs alive). Setters and requests may be called from any
// thread.
class ImageGenerator {
  public:
    virtual ~ImageGenerator() = default;

    // A generator from implementation(): the real one, decoding with FFmpeg,
    // unless a test replaced it.
    static std::shared_ptr<ImageGenerator> imageGeneratorWithAsset(std::shared_ptr<Asset> asset);
    using Maker = std::shared_ptr<ImageGenerator>(std::shared_ptr<Asset>);
    static Implementation<Maker>& implementation();

    virtual std::shared_ptr<Asset> asset() const = 0;

    // Images are scaled down, keeping the aspect, to fit in this box (in
    // pixels). A zero, negative or non-finite side does not constrain. Default:
    // no limit (the frame's own size).
    virtual QSizeF maximumSize() const = 0;
    virtual void setMaximumSize(const QSizeF& size) = 0;

    // When true, images are turned by the track's preferred transform (a
    // portrait recording comes out upright). Default false: the coded
    // orientation.
    virtual bool appliesPreferredTrackTransform() const = 0;
    virtual void setAppliesPreferredTrackTransform(bool applies) = 0;

    // How far from the requested time the frame may lie. The default, positive
    // infinity on both sides, gives the nearest keyframe at or before the
    // time (cheap: one frame is decoded). Zero on both sides gives the frame
    // shown at the time exactly (decoding from the keyframe before it).
    virtual MediaTime requestedTimeToleranceBefore() const = 0;
    virtual MediaTime requestedTimeToleranceAfter() const = 0;
    virtual void setRequestedTimeToleranceBefore(const MediaTime& tolerance) = 0;
    virtual void setRequestedTimeToleranceAfter(const MediaTime& tolerance) = 0;

    // Queues the times. A time at or past the end gives the last keyframe
    // (or, with zero tolerance, the last frame); a Failed result comes only
    // when no frame can be decoded.
    virtual void
    generateImagesAsynchronouslyForTimes_completionHandler(const QList<MediaTime>& requestedTimes,
                                                           ImageGenerationHandler handler) = 0;

    // Every time not yet started completes with Cancelled (the one being
    // decoded finishes normally). Later requests are served as usual.
    virtual void cancelAllImageGeneration() = 0;

    // The image at one time, on the caller's thread. Sets `actualTime` and
    // `error` (when not null) as a completion would.
    virtual QImage copyImageAtTime_actualTime_error(const MediaTime& requestedTime,
                                                    MediaTime* actualTime, ErrorPtr* error) = 0;
};

} // namespace platform
