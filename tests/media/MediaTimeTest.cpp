#include "platform/media/MediaTime.h"
#include "StreamTime.h"

#include <gtest/gtest.h>

#include <cmath>

using platform::MediaTime;
using platform::MediaTimeRange;
namespace StreamTime = platform::StreamTime;

TEST(MediaTime, FromSecondsRoundsToTheNearestValue) {
    EXPECT_EQ(MediaTime::fromSeconds(1.5, 600).value, 900);
    EXPECT_EQ(MediaTime::fromSeconds(0.0016, 1000).value, 2);
    EXPECT_EQ(MediaTime::fromSeconds(-0.0016, 1000).value, -2);
    // The editor's observer times: seconds at 1e9.
    EXPECT_EQ(MediaTime::fromSeconds(2.000000001, 1000000000).value, 2000000001);
    EXPECT_FALSE(MediaTime::fromSeconds(1.0, 0).isValid());
    EXPECT_FALSE(MediaTime::fromSeconds(NAN, 600).isValid());
    EXPECT_TRUE(std::isnan(MediaTime::invalid().seconds()));
    EXPECT_EQ(MediaTime::invalid().value, 0);
    EXPECT_EQ(MediaTime::invalid().flags, 0u);
}

TEST(MediaTime, ComparesAcrossTimescalesAndOrdersInvalidFirst) {
    EXPECT_EQ(MediaTime::make(1, 30), MediaTime::make(3000, 90000));
    EXPECT_LT(MediaTime::make(1, 30), MediaTime::make(3001, 90000));
    EXPECT_LT(MediaTime::invalid(), MediaTime::make(-100, 1));
    EXPECT_LT(MediaTime::make(1 << 30, 1), MediaTime::positiveInfinity());
    const MediaTimeRange r = MediaTimeRange::make(MediaTime::make(2, 1), MediaTime::make(3, 1));
    EXPECT_EQ(r.end(), MediaTime::make(5, 1));
    EXPECT_TRUE(r.containsTime(MediaTime::make(2, 1)));
    EXPECT_FALSE(r.containsTime(MediaTime::make(5, 1)));
}

TEST(StreamTime, ConvertsBetweenMediaTimeAndStreamTimeBases) {
    // 2.5 s at a 1/90000 stream, and back.
    const MediaTime t = MediaTime::fromSeconds(2.5, 600);
    EXPECT_EQ(StreamTime::fromMediaTime(t, {1, 90000}), 225000);
    EXPECT_EQ(StreamTime::toMediaTime(225000, {1, 90000}), t);
    EXPECT_EQ(StreamTime::toMediaTime(225000, {1, 90000}).timescale, 90000);
    // Rounded to the nearest tick of a coarse base.
    EXPECT_EQ(StreamTime::fromMediaTime(MediaTime::make(1, 60), {1, 30}), 1); // 0.5 tick rounds up
    EXPECT_EQ(StreamTime::fromMediaTime(MediaTime::make(1, 100), {1, 30}), 0);
    // Not a number either way.
    EXPECT_FALSE(StreamTime::toMediaTime(AV_NOPTS_VALUE, {1, 90000}).isValid());
    EXPECT_EQ(StreamTime::fromMediaTime(MediaTime::invalid(), {1, 90000}), AV_NOPTS_VALUE);
    EXPECT_EQ(StreamTime::fromMediaTime(MediaTime::positiveInfinity(), {1, 90000}), AV_NOPTS_VALUE);
    // A time base whose numerator is not 1.
    EXPECT_EQ(StreamTime::toMediaTime(3, {1001, 30000}), MediaTime::make(3003, 30000));
}
