#include "FragmentIndex.h"
#include "MediaFixtures.h"

#include <QFileInfo>
#include <gtest/gtest.h>

using namespace platform;
using testmedia::Container;
using testmedia::MovieSpec;

namespace {

MovieSpec fragmented(int bFrames, bool segmentIndex, bool truncated) {
    MovieSpec s;
    s.seconds = 4;
    s.container = Container::FragmentedMp4;
    s.bFrames = bFrames;
    s.segmentIndex = segmentIndex;
    s.truncated = truncated;
    return s;
}

} // namespace

// Every sample of every fragment, whatever index comes first: a segment
// index lists fragments, not samples, and must not hide the later ones.
TEST(FragmentIndex, ListsEverySampleWithItsCompositionOffset) {
    for (bool segmentIndex : {false, true}) {
        SCOPED_TRACE(segmentIndex);
        const MovieSpec movieSpec = fragmented(2, segmentIndex, false);
        const QString path = mediatest::movieFor(movieSpec);
        const std::optional<FragmentIndex> index = FragmentIndex::read(path);
        ASSERT_TRUE(index);
        ASSERT_EQ(index->tracks.size(), 2u);
        const FragmentTrack& video = index->tracks[0];
        EXPECT_EQ(int(video.samples.size()), testmedia::frameCount(movieSpec));
        EXPECT_TRUE(video.reordered);
        int keys = 0;
        for (size_t i = 0; i < video.samples.size(); ++i) {
            const FragmentSample& s = video.samples[i];
            keys += s.key;
            EXPECT_GE(s.pts, s.dts);
            if (i > 0) {
                EXPECT_GT(s.dts, video.samples[i - 1].dts);
                EXPECT_GE(s.pos, video.samples[i - 1].pos + video.samples[i - 1].size);
            }
        }
        EXPECT_EQ(keys, testmedia::frameCount(movieSpec) / movieSpec.keyframeInterval);
        EXPECT_FALSE(index->tracks[1].reordered);
        // All of it is complete (a fragment random-access box may follow).
        EXPECT_LE(index->completeBytes, QFileInfo(path).size());
        EXPECT_GT(index->completeBytes, QFileInfo(path).size() - 1024);
    }
    EXPECT_FALSE(FragmentIndex::read(mediatest::movieFor(MovieSpec{})));
}

TEST(FragmentIndex, LeavesOutTheFragmentThatWasCutShort) {
    const MovieSpec whole = fragmented(0, false, false);
    const MovieSpec cut = fragmented(0, false, true);
    const std::optional<FragmentIndex> all = FragmentIndex::read(mediatest::movieFor(whole));
    const std::optional<FragmentIndex> part = FragmentIndex::read(mediatest::movieFor(cut));
    ASSERT_TRUE(all && part);
    const auto& samples = part->tracks[0].samples;
    ASSERT_FALSE(samples.empty());
    EXPECT_LT(samples.size(), all->tracks[0].samples.size());
    // Whole fragments: a keyframe interval each.
    EXPECT_EQ(samples.size() % size_t(cut.keyframeInterval), 0u);
    EXPECT_LE(samples.back().pos + samples.back().size, part->completeBytes);
    EXPECT_LT(part->completeBytes, part->fileSize);
    for (size_t i = 0; i < samples.size(); ++i)
        EXPECT_EQ(samples[i].pos, all->tracks[0].samples[i].pos);
}
