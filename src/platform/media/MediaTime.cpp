#include "MediaTime.h"

#include <cmath>
#include <limits>

namespace platform {
namespace {

// a * b / c rounded to nearest, without overflowing for the magnitudes of
// media times (128-bit intermediate).
std::int64_t rescale(std::int64_t a, std::int64_t b, std::int64_t c) {
    const __int128 product = static_cast<__int128>(a) * b;
    const __int128 half = c / 2;
    const __int128 rounded = product >= 0 ? (product + half) / c : (product - half) / c;
    return static_cast<std::int64_t>(rounded);
}

int rank(const MediaTime& t) {
    if (!t.isValid())
        return 0;
    if (t.flags & MediaTime::NegativeInfinity)
        return 1;
    if (t.flags & MediaTime::PositiveInfinity)
        return 3;
    if (t.flags & MediaTime::Indefinite)
        return 4;
    return 2;
}

} // namespace

MediaTime MediaTime::make(std::int64_t value, std::int32_t timescale) {
    if (timescale <= 0)
        return invalid();
    return {value, timescale, Valid, 0};
}

MediaTime MediaTime::fromSeconds(double seconds, std::int32_t timescale) {
    if (std::isnan(seconds) || timescale <= 0)
        return invalid();
    if (std::isinf(seconds))
        return {0, 0, Valid | (seconds > 0 ? PositiveInfinity : NegativeInfinity), 0};
    const double scaled = seconds * timescale;
    if (std::fabs(scaled) >= 9.2e18)
        return {0, 0, Valid | (seconds > 0 ? PositiveInfinity : NegativeInfinity), 0};
    const auto value = static_cast<std::int64_t>(std::llround(scaled));
    MediaTime t = make(value, timescale);
    if (double(value) != scaled)
        t.flags |= HasBeenRounded;
    return t;
}

double MediaTime::seconds() const {
    if (!isValid() || (flags & Indefinite))
        return std::numeric_limits<double>::quiet_NaN();
    if (flags & PositiveInfinity)
        return std::numeric_limits<double>::infinity();
    if (flags & NegativeInfinity)
        return -std::numeric_limits<double>::infinity();
    return double(value) / double(timescale);
}

MediaTime MediaTime::convertScale(std::int32_t newTimescale) const {
    if (!isNumeric() || newTimescale <= 0)
        return newTimescale <= 0 ? invalid() : *this;
    MediaTime t = make(rescale(value, newTimescale, timescale), newTimescale);
    if (static_cast<__int128>(t.value) * timescale != static_cast<__int128>(value) * newTimescale)
        t.flags |= HasBeenRounded;
    t.epoch = epoch;
    return t;
}

std::strong_ordering operator<=>(const MediaTime& a, const MediaTime& b) {
    const int ra = rank(a), rb = rank(b);
    if (ra != rb || ra != 2)
        return ra <=> rb;
    if (a.epoch != b.epoch)
        return a.epoch <=> b.epoch;
    const __int128 left = static_cast<__int128>(a.value) * b.timescale;
    const __int128 right = static_cast<__int128>(b.value) * a.timescale;
    return left < right   ? std::strong_ordering::less
           : left > right ? std::strong_ordering::greater
                          : std::strong_ordering::equal;
}

MediaTime operator+(const MediaTime& a, const MediaTime& b) {
    if (!a.isNumeric() || !b.isNumeric())
        return !a.isValid() || !b.isValid() ? MediaTime::invalid() : (a.isNumeric() ? b : a);
    if (a.timescale == b.timescale)
        return MediaTime::make(a.value + b.value, a.timescale);
    const std::int32_t scale = std::max(a.timescale, b.timescale);
    return MediaTime::make(a.convertScale(scale).value + b.convertScale(scale).value, scale);
}

MediaTime operator-(const MediaTime& a, const MediaTime& b) {
    MediaTime negated = b;
    if (b.isNumeric())
        negated.value = -b.value;
    else if (b.flags & MediaTime::PositiveInfinity)
        negated.flags = MediaTime::Valid | MediaTime::NegativeInfinity;
    else if (b.flags & MediaTime::NegativeInfinity)
        negated.flags = MediaTime::Valid | MediaTime::PositiveInfinity;
    return a + negated;
}

QString MediaTime::description() const {
    if (!isValid())
        return QStringLiteral("{invalid}");
    if (!isNumeric())
        return QStringLiteral("{%1}").arg(seconds());
    return QStringLiteral("{%1/%2 = %3}").arg(value).arg(timescale).arg(seconds());
}

} // namespace platform
