#pragma once

namespace platform {

// The trim range inside a movie, in seconds. Keeps its invariant on every
// change: 0 <= start, end <= duration and end - start >= the minimum length,
// as far as the movie allows (a movie shorter than the minimum keeps the whole
// movie selected). Plain value; any thread.
class TrimRange {
  public:
    // Selects the whole movie of `duration` seconds (0 for no movie).
    void reset(double duration);
    // Keeps the range, pulled back inside a movie of `duration` seconds.
    void refit(double duration);
    void setMinimumLength(double seconds);
    double minimumLength() const { return minimumLength_; }

    double start() const { return start_; }
    double end() const { return end_; }
    double duration() const { return duration_; }
    bool isWholeMovie() const { return start_ <= 0.0 && end_ >= duration_; }

    // Where the start (end) handle lands when asked to go to `seconds`.
    double clampStart(double seconds) const;
    double clampEnd(double seconds) const;
    // Move a handle; returns whether it moved.
    bool setStart(double seconds);
    bool setEnd(double seconds);

  private:
    double effectiveMinimum() const;
    void enforce();

    double duration_ = 0.0;
    double minimumLength_ = 1.0;
    double start_ = 0.0;
    double end_ = 0.0;
};

} // namespace platform
