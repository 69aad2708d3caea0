#pragma once

#include "platform/media/MediaTime.h"
#include "platform/runtime/Error.h"

#include <QImage>
#include <QSize>
#include <QString>

#include <memory>

namespace platform {

// Decodes single frames of a file's first video stream: the keyframe at or
// before a time, or the frame shown at a time. Owns the demuxer, the decoder
// and the scaler; one thread at a time.
class VideoFrameReader {
  public:
    ~VideoFrameReader();
    VideoFrameReader(const VideoFrameReader&) = delete;
    VideoFrameReader& operator=(const VideoFrameReader&) = delete;

    // Null, with `error` set, when the file does not open or has no video
    // stream that can be decoded.
    static std::unique_ptr<VideoFrameReader> open(const QString& hostPath, ErrorPtr* error);

    struct Frame {
        QImage image;   // RGB32, scaled to fit `box` (coded orientation)
        MediaTime time; // the frame's presentation time
    };

    // `exact` false: the nearest keyframe at or before `time` (the last one
    // for a time at or past the end). `exact` true: the last frame whose
    // time is at or before `time` (the first frame for an earlier time).
    // `box` bounds the image, keeping the aspect; an empty side is free.
    // A null image, with `error` set, when no frame can be decoded.
    Frame frameAt(const MediaTime& time, bool exact, const QSize& box, ErrorPtr* error);

  private:
    struct State;
    explicit VideoFrameReader(std::unique_ptr<State> state);
    std::unique_ptr<State> d;
};

} // namespace platform
