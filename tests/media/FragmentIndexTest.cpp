#include "FragmentIndex.h"
#include "MediaFixtures.h"

#include <QFileInfo>
#include <gtest/gtest.h>

using namespace platform;
using testmedia::MovieSpec;

// Every sample of every fragment with its composition offset, whatever index
// comes first (a segment index lists fragments, not samples, and must not
// hide the later ones); of a file cut short, the whole fragments only.
TEST(FragmentIndex, ListsEverySampleOfEveryCompleteFragment) {
    MovieSpec whole{.seconds = 4, .bFrames = 2, .container = testmedia::Container::FragmentedMp4};
    std::optional<FragmentIndex> all;
    for (bool segmentIndex : {true, false}) {
        SCOPED_TRACE(segmentIndex);
        whole.segmentIndex = segmentIndex;
        const QString path = mediatest::movieFor(whole);
        all = FragmentIndex::read(path);
        ASSERT_TRUE(all);
        ASSERT_EQ(all->tracks.size(), 2u);
        const FragmentTrack& video = all->tracks[0];
        EXPECT_EQ(int(video.samples.size()), testmedia::frameCount(whole));
        EXPECT_TRUE(video.reordered);
        EXPECT_FALSE(all->tracks[1].reordered);
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
        EXPECT_EQ(keys, testmedia::frameCount(whole) / whole.keyframeInterval);
        // All of it is complete (a fragment random-access box may follow).
        EXPECT_LE(all->completeBytes, QFileInfo(path).size());
        EXPECT_GT(all->completeBytes, QFileInfo(path).size() - 1024);
    }

    MovieSpec cut = whole;
    cut.truncated = true;
    const std::optional<FragmentIndex> part = FragmentIndex::read(mediatest::movieFor(cut));
    ASSERT_TRUE(part);
    const auto& samples = part->tracks[0].samples;
    ASSERT_FALSE(samples.empty());
    EXPECT_LT(samples.size(), all->tracks[0].samples.size());
    EXPECT_EQ(samples.size() % size_t(cut.keyframeInterval), 0u);
    EXPECT_LE(samples.back().pos + samples.back().size, part->completeBytes);
    EXPECT_LT(part->completeBytes, part->fileSize);
    for (size_t i = 0; i < samples.size(); ++i)
        EXPECT_EQ(samples[i].pos, all->tracks[0].samples[i].pos);

    EXPECT_FALSE(FragmentIndex::read(mediatest::movieFor(MovieSpec{})));
}
