#pragma once

namespace platform {

// x = origin + pixelsPerSecond * t: how a moment of the movie lands on the
// scrubber's track. Plain value; any thread.
struct TimelineMapping {
    double origin = 0.0;          // x of time 0, widget pixels
    double pixelsPerSecond = 0.0; // > 0 for a usable mapping

    double xForTime(double seconds) const { return origin + pixelsPerSecond * seconds; }
    double timeForX(double x) const;
    bool isUsable() const { return pixelsPerSecond > 0.0; }
    // The mapping `progress` of the way from `from` to `to` (0..1). Any point
    // that both put at the same x stays there all along.
    static TimelineMapping blend(const TimelineMapping& from, const TimelineMapping& to,
                                 double progress);
};

// The scrubber's time axis: the movie's length laid over the track, and the
// zoomed view used for fine trimming. Pure geometry, no Qt; main thread in
// practice. Times are seconds, positions widget pixels.
class ScrubberTimeline {
  public:
    // A duration that is not a finite positive number means "no movie".
    void setDuration(double seconds);
    double duration() const { return duration_; }
    bool hasMovie() const { return duration_ > 0.0; }

    void setTrack(double left, double width);
    double trackLeft() const { return trackLeft_; }
    double trackWidth() const { return trackWidth_; }
    double trackRight() const { return trackLeft_ + trackWidth_; }

    // The whole movie over the whole track; unusable without a movie or track.
    TimelineMapping overview() const;

    // Zooms by `factor` (> 1) so that `anchorTime` stays at `anchorX`; the
    // view may then reach past either end of the movie.
    void zoomAround(double anchorTime, double anchorX, double factor);
    void unzoom() { zoomed_ = false; }
    bool isZoomed() const { return zoomed_; }
    // The zoomed mapping, kept after unzoom so a zoom-out can be animated.
    const TimelineMapping& zoomMapping() const { return zoom_; }
    // The mapping the user's hand works in: zoomed or overview.
    TimelineMapping active() const { return zoomed_ ? zoom_ : overview(); }

    double clampToMovie(double seconds) const;

  private:
    double duration_ = 0.0;
    double trackLeft_ = 0.0;
    double trackWidth_ = 0.0;
    bool zoomed_ = false;
    TimelineMapping zoom_;
};

} // namespace platform
