#pragma once

#include <QString>
#include <compare>
#include <cstdint>

namespace platform {

// A rational media time: value / timescale seconds, with flags and an epoch.
// The invalid time is all zeros. Plain value type; any thread.
struct MediaTime {
    enum Flags : std::uint32_t {
        Valid = 1u << 0,
        HasBeenRounded = 1u << 1,
        PositiveInfinity = 1u << 2,
        NegativeInfinity = 1u << 3,
        Indefinite = 1u << 4,
    };

    std::int64_t value = 0;
    std::int32_t timescale = 0;
    std::uint32_t flags = 0;
    std::int64_t epoch = 0;

    static MediaTime invalid() { return {}; }
    static MediaTime zero() { return make(0, 1); }
    static MediaTime positiveInfinity() { return {0, 0, Valid | PositiveInfinity, 0}; }
    static MediaTime make(std::int64_t value, std::int32_t timescale);
    // `seconds` at `timescale`, rounded to the nearest value; invalid for NaN
    // or a timescale <= 0; +/-infinity for infinite seconds.
    static MediaTime fromSeconds(double seconds, std::int32_t timescale);

    bool isValid() const { return (flags & Valid) != 0; }
    bool isNumeric() const {
        return isValid() && !(flags & (PositiveInfinity | NegativeInfinity | Indefinite));
    }
    // NaN when invalid or indefinite; +/-inf for the infinities.
    double seconds() const;
    // The same instant at another timescale, rounded to the nearest value.
    MediaTime convertScale(std::int32_t newTimescale) const;

    // Orders numeric times by the instant they stand for (exactly, across
    // timescales); invalid times sort before everything, -inf before numbers,
    // +inf after them.
    friend std::strong_ordering operator<=>(const MediaTime& a, const MediaTime& b);
    friend bool operator==(const MediaTime& a, const MediaTime& b) { return (a <=> b) == 0; }

    friend MediaTime operator+(const MediaTime& a, const MediaTime& b);
    friend MediaTime operator-(const MediaTime& a, const MediaTime& b);

    QString description() const; // "{value/timescale = seconds}", for logs and test failures
};

// A time range: a start and a duration.
struct MediaTimeRange {
    MediaTime start;
    MediaTime duration;

    static MediaTimeRange make(MediaTime start, MediaTime duration) { return {start, duration}; }
    static MediaTimeRange fromStartToEnd(MediaTime start, MediaTime end) {
        return {start, end - start};
    }
    MediaTime end() const { return start + duration; }
    bool isValid() const {
        return start.isValid() && duration.isValid() && duration >= MediaTime::zero();
    }
    bool isEmpty() const { return !isValid() || duration == MediaTime::zero(); }
    bool containsTime(const MediaTime& t) const { return t >= start && t < end(); }
    friend bool operator==(const MediaTimeRange&, const MediaTimeRange&) = default;
};

} // namespace platform
