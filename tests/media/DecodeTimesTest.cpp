#include "DecodeTimes.h"

#include <gtest/gtest.h>

using namespace platform::DecodeTimes;

// After a seek in Matroska the demuxer has no decode times for the first
// frames of a reordered stream: I (shown at 100), P (shown at 400), then B
// frames whose decode times it knows.
TEST(DecodeTimes, FramesWithoutOneGetThemBeforeTheNextKnownOne) {
    std::vector<Stamp> run = {{kNone, 100, 100}, {kNone, 400, 100}};
    fillRun(run, 100, kNone);
    EXPECT_EQ(run[0].dts, -100);
    EXPECT_EQ(run[1].dts, 0);
    // Never after a frame's own presentation time, however close the next.
    run = {{kNone, 100, 100}, {kNone, 400, 100}};
    fillRun(run, 150, kNone);
    EXPECT_LE(run[0].dts, 100);
    EXPECT_LT(run[0].dts, run[1].dts);
    EXPECT_LT(run[1].dts, 150);
    // Unknown durations step by one tick.
    run = {{kNone, 7, 0}, {kNone, kNone, 0}};
    fillRun(run, 10, kNone);
    EXPECT_EQ(run[0].dts, 7);
    EXPECT_EQ(run[1].dts, 9);
}

TEST(DecodeTimes, AtTheEndTheyFollowTheLastOne) {
    std::vector<Stamp> run = {{kNone, 900, 100}, {kNone, 1000, 100}};
    fillRun(run, kNone, 800);
    EXPECT_EQ(run[0].dts, 900);
    EXPECT_EQ(run[1].dts, 1000);
    run = {{kNone, 50, 10}};
    fillRun(run, kNone, kNone);
    EXPECT_EQ(run[0].dts, 50);
}

TEST(DecodeTimes, KeepRisingRepairsStallsAndReversals) {
    Stamp s{100, 100, 10};
    EXPECT_EQ(keepRising(s, kNone), 100);
    // A repeated decode time (a millisecond clock rounding two frames alike).
    s = {100, 100, 10};
    EXPECT_EQ(keepRising(s, 100), 101);
    EXPECT_EQ(s.pts, 101);
    // One that goes back; the presentation time stays when it is later.
    s = {90, 300, 10};
    EXPECT_EQ(keepRising(s, 100), 101);
    EXPECT_EQ(s.pts, 300);
    s = {kNone, kNone, 0};
    EXPECT_EQ(keepRising(s, 5), 6);
}
