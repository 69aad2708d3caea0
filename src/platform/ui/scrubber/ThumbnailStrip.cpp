#include "platform/ui/scrubber/ThumbnailStrip.h"

#include <cmath>

namespace platform {

ThumbnailStrip::ThumbnailStrip(double start, double end, int count, const QList<double>& timestamps)
    : start_(start), end_(end), count_(count) {
    if (count <= 0 || !(end > start))
        return;
    const double span = (end - start) / count;
    for (double stamp : timestamps) {
        if (static_cast<int>(entries_.size()) == count)
            break;
        if (!std::isfinite(stamp))
            continue;
        entries_.push_back({stamp, stamp, stamp + span, {}});
    }
}

bool ThumbnailStrip::covers(double start, double end, int count) const {
    return count_ == count && start_ == start && end_ == end;
}

QList<double> ThumbnailStrip::timestamps() const {
    QList<double> stamps;
    stamps.reserve(static_cast<qsizetype>(entries_.size()));
    for (const ThumbnailSlot& slot : entries_)
        stamps.append(slot.timestamp);
    return stamps;
}

bool ThumbnailStrip::setImage(double timestamp, const QImage& image) {
    bool matched = false;
    for (ThumbnailSlot& slot : entries_) {
        if (slot.timestamp == timestamp) {
            slot.image = image;
            matched = true;
        }
    }
    return matched;
}

void ThumbnailStrip::adoptImages(const ThumbnailStrip& other) {
    for (const ThumbnailSlot& old : other.entries_) {
        if (!old.image.isNull())
            setImage(old.timestamp, old.image);
    }
}

} // namespace platform
