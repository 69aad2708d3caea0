#include "CutPlanner.h"

#include <gtest/gtest.h>

using namespace platform::CutPlanner;

namespace {

// Keyframes every `gop` frames of `frameTicks`, shown `delay` after they are
// decoded (reordered streams), `frames` in all.
TrackInfo video(int frames, int gop, std::int64_t frameTicks, std::int64_t delay = 0) {
    TrackInfo t;
    t.kind = TrackKind::Video;
    for (int i = 0; i < frames; i += gop)
        t.syncSamples.push_back({i * frameTicks, i * frameTicks + delay});
    t.end = frames * frameTicks;
    return t;
}

// AAC at 48 kHz in a 1/48000 time base: every frame decodes alone, 1024
// samples each, the first starting `lead` samples before 0 (priming).
TrackInfo audio(int frames, std::int64_t lead = 0) {
    TrackInfo t;
    t.kind = TrackKind::Audio;
    for (int i = 0; i < frames; ++i)
        t.syncSamples.push_back({i * 1024 - lead, i * 1024 - lead});
    t.end = frames * 1024 - lead;
    t.preroll = 1024;
    return t;
}

} // namespace

TEST(CutPlanner, VideoStartsAtTheKeyframeAtOrBeforeTheStartAndHidesTheLead) {
    const TrackInfo t = video(300, 30, 3000); // 10 s at 30 fps, 1/90000
    // Between keyframes: from the one before, 15 frames hidden.
    TrackCut cut = planTrack(t, 45 * 3000, 100 * 3000);
    EXPECT_FALSE(cut.empty);
    EXPECT_EQ(cut.firstDts, 30 * 3000);
    EXPECT_EQ(cut.offset, 45 * 3000);
    EXPECT_EQ(cut.hiddenLead, 15 * 3000);
    EXPECT_EQ(cut.stopAt, 100 * 3000);
    EXPECT_EQ(cut.editDuration, 55 * 3000);
    // On a keyframe: nothing hidden.
    cut = planTrack(t, 60 * 3000, 90 * 3000);
    EXPECT_EQ(cut.firstDts, 60 * 3000);
    EXPECT_EQ(cut.hiddenLead, 0);
    // One tick before a keyframe still needs the previous one.
    cut = planTrack(t, 60 * 3000 - 1, 90 * 3000);
    EXPECT_EQ(cut.firstDts, 30 * 3000);
}

TEST(CutPlanner, ReorderedKeyframesAreChosenByPresentationTime) {
    // Keyframes shown two frames after they are decoded.
    const TrackInfo t = video(300, 30, 3000, 2 * 3000);
    // Start at frame 31 (shown at 31*3000): keyframe 30 is shown at 32*3000,
    // after the start, so the cut must begin at keyframe 0.
    TrackCut cut = planTrack(t, 31 * 3000, 60 * 3000);
    EXPECT_EQ(cut.firstDts, 0);
    EXPECT_EQ(cut.firstPts, 2 * 3000);
    cut = planTrack(t, 32 * 3000, 60 * 3000);
    EXPECT_EQ(cut.firstDts, 30 * 3000);
    EXPECT_EQ(cut.hiddenLead, 0);
}

TEST(CutPlanner, ClipsAtTheTracksEndAndRefusesWhatLiesOutside) {
    const TrackInfo t = video(300, 30, 3000);
    TrackCut cut = planTrack(t, 200 * 3000, 400 * 3000);
    EXPECT_FALSE(cut.empty);
    EXPECT_EQ(cut.stopAt, 300 * 3000);
    EXPECT_EQ(cut.editDuration, 100 * 3000);
    EXPECT_TRUE(planTrack(t, 300 * 3000, 310 * 3000).empty);
    EXPECT_TRUE(planTrack(t, 50 * 3000, 50 * 3000).empty);
    EXPECT_TRUE(planTrack(t, 50 * 3000, 40 * 3000).empty);
    EXPECT_TRUE(planTrack(TrackInfo{}, 0, 100).empty);
    // A negative start is the track's start.
    cut = planTrack(t, -500, 3000);
    EXPECT_EQ(cut.offset, 0);
    EXPECT_EQ(cut.editDuration, 3000);
}

TEST(CutPlanner, AudioKeepsOneFrameOfPrimingBeforeTheStart) {
    const TrackInfo t = audio(500, 1024);
    // 1 s in: the frame holding 48000 - 1024 is where decoding starts.
    TrackCut cut = planTrack(t, 48000, 96000);
    EXPECT_LE(cut.firstPts, 48000 - 1024);
    EXPECT_GT(cut.firstPts, 48000 - 2 * 1024);
    EXPECT_EQ(cut.offset, 48000);
    EXPECT_EQ(cut.hiddenLead, 48000 - cut.firstPts);
    // At 0 the source's own priming frame comes along.
    cut = planTrack(t, 0, 48000);
    EXPECT_EQ(cut.firstPts, -1024);
    EXPECT_EQ(cut.hiddenLead, 1024);
}

TEST(CutPlanner, MovingTheStartBackKeepsTheEnd) {
    const TrackInfo t = video(300, 30, 3000);
    const TrackCut cut = planTrack(t, 45 * 3000 + 1000, 100 * 3000);
    // The frame shown at the start began 1000 ticks earlier.
    const TrackCut moved = startingAt(cut, 45 * 3000);
    EXPECT_EQ(moved.offset, 45 * 3000);
    EXPECT_EQ(moved.hiddenLead, 15 * 3000);
    EXPECT_EQ(moved.offset + moved.editDuration, cut.offset + cut.editDuration);
    EXPECT_EQ(moved.firstDts, cut.firstDts);
    // Later, when the video begins after the requested start: what plays
    // shrinks, nothing plays once the start reaches the end, and an empty cut
    // stays empty.
    const TrackCut later = startingAt(cut, 50 * 3000);
    EXPECT_EQ(later.offset, 50 * 3000);
    EXPECT_EQ(later.offset + later.editDuration, cut.offset + cut.editDuration);
    EXPECT_TRUE(startingAt(cut, 100 * 3000).empty);
    EXPECT_TRUE(startingAt(TrackCut{}, 0).empty);
}

// Matroska cues often list only the video's keyframes: the audio must still
// be planned (and read from early enough to keep its priming), and video
// without an index is read from the start itself, the reader finding the
// keyframe.
TEST(CutPlanner, TracksTheIndexLeavesOutAreStillCut) {
    TrackInfo unindexedAudio = audio(500);
    unindexedAudio.syncSamples.clear();
    TrackCut cut = planTrack(unindexedAudio, 48000, 96000);
    ASSERT_FALSE(cut.empty);
    EXPECT_LE(cut.firstPts, 48000 - 2 * 1024);
    EXPECT_EQ(cut.offset, 48000);
    EXPECT_EQ(cut.stopAt, 96000);
    EXPECT_EQ(cut.editDuration, 48000);

    TrackInfo unindexedVideo = video(300, 30, 3000);
    unindexedVideo.syncSamples.clear();
    cut = planTrack(unindexedVideo, 45 * 3000, 100 * 3000);
    ASSERT_FALSE(cut.empty);
    EXPECT_EQ(cut.firstDts, 45 * 3000);
    EXPECT_EQ(cut.editDuration, 55 * 3000);
    EXPECT_TRUE(planTrack(unindexedVideo, 400 * 3000, 500 * 3000).empty);
}
