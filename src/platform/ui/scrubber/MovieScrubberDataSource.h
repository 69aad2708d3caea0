#pragma once

#include <QList>

namespace platform {

class MovieScrubber;

// Where a MovieScrubber gets the movie from. Called on the main thread, from
// reloadData, from the scrubber's layout after a resize and when the strip
// zooms; never from painting. Held weakly by the scrubber, kept alive for the
// length of one call. The data source may call back into the scrubber
// (setThumbnailImage_forTimestamp, even reloadData) from inside any call.
class MovieScrubberDataSource {
  public:
    virtual ~MovieScrubberDataSource() = default;

    // The movie's length in seconds. Not a number, infinite or <= 0 means "no
    // movie yet": the strip stays empty and the scrubber ignores the user.
    virtual double movieScrubberDuration(MovieScrubber* scrubber) = 0;

    // Width over height of one thumbnail. Values that are not positive
    // numbers count as 1.
    virtual float movieScrubberThumbnailAspectRatio(MovieScrubber* scrubber) = 0;

    // Up to `count` time stamps, in seconds, for thumbnails evenly spaced over
    // [start, end): the i-th stands for the slot that begins at
    // start + i * (end - start) / count. Returning fewer leaves the last slots
    // empty. The scrubber hands each stamp back, unchanged, to
    // movieScrubber_requestThumbnailImageForTimestamp.
    virtual QList<double>
    movieScrubber_evenlySpacedTimestamps_startingAt_endingAt(MovieScrubber* scrubber, int count,
                                                             double start, double end) = 0;

    // Asks for the picture at `timestamp`. Answer at any later time (or at
    // once) with MovieScrubber::setThumbnailImage_forTimestamp on the main
    // thread, or never: the slot then stays empty.
    virtual void movieScrubber_requestThumbnailImageForTimestamp(MovieScrubber* scrubber,
                                                                 double timestamp) = 0;

    // Length of one frame in seconds, for the arrow keys. The scrubber's own
    // frameDuration property, when set, wins. Not a positive number (the
    // default) means unknown: the arrow keys then step 1/30 s.
    virtual double movieScrubberFrameDuration(MovieScrubber* scrubber) { return 0.0; }
};

} // namespace platform
