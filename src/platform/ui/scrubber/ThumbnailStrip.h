#pragma once

#include <QImage>
#include <QList>
#include <vector>

namespace platform {

// One thumbnail's place on the strip: the span of movie time it stands for
// and, once handed over, its picture.
struct ThumbnailSlot {
    double timestamp = 0.0; // as the data source gave it, handed back unchanged
    double start = 0.0;     // seconds; the slot covers [start, end)
    double end = 0.0;
    QImage image; // null until it arrives
};

// A row of evenly spaced thumbnails over a span of the movie. Plain value;
// main thread in practice.
class ThumbnailStrip {
  public:
    ThumbnailStrip() = default;
    // `count` slots over [start, end), placed at the given time stamps. Stamps
    // that are not numbers, and any past `count`, are dropped.
    ThumbnailStrip(double start, double end, int count, const QList<double>& timestamps);

    bool isEmpty() const { return entries_.empty(); }
    // Whether this strip was laid out for the same span and count.
    bool covers(double start, double end, int count) const;
    const std::vector<ThumbnailSlot>& entries() const { return entries_; }
    QList<double> timestamps() const;

    // Shows `image` in every slot whose stamp equals `timestamp` exactly;
    // returns whether one did. Images for stamps not on the strip are dropped.
    bool setImage(double timestamp, const QImage& image);
    // Takes the pictures `other` already has for the same stamps.
    void adoptImages(const ThumbnailStrip& other);

  private:
    double start_ = 0.0;
    double end_ = 0.0;
    int count_ = 0;
    std::vector<ThumbnailSlot> entries_;
};

} // namespace platform
