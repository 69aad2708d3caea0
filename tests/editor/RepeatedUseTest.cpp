// The way out, over and over: the editor opened and cancelled at once, and
// the typical use, again and again on the shortest recording, without one
// abnormal end. Each batch is a test of its own, so batches run side by side.

#include "EndToEndFixture.h"
#include "MediaGenerator.h"

#include <QDir>

namespace {

constexpr int kBatches = 5;
constexpr int kOpenCancelPerBatch = 10; // 50 in all
constexpr int kTypicalUsePerBatch = 4;  // 20 in all

} // namespace

class RepeatedUse : public EndToEnd, public ::testing::WithParamInterface<int> {
  protected:
    static void SetUpTestSuite() {
        dir = new QTemporaryDir;
        testmedia::MovieSpec movieSpec;
        movieSpec.seconds = 2; // the shortest that takes a trim (one second at least)
        movieSpec.keyframeInterval = 10;
        QString error;
        ASSERT_TRUE(testmedia::writeMovie(recording(), movieSpec, &error)) << error.toStdString();
    }

    static void expectNormalEnd(const Run& run, int round) {
        EXPECT_EQ(run.exitCode, 0) << "round " << round << "\n" << run.err.toStdString();
        EXPECT_FALSE(run.err.contains("abnormally")) << "round " << round << "\n"
                                                     << run.err.toStdString();
        EXPECT_FALSE(run.err.contains("Sanitizer")) << "round " << round;
    }
};

TEST_P(RepeatedUse, OpenAndCancelAtOnce) {
    for (int round = 0; round < kOpenCancelPerBatch; ++round) {
        const Run run = edit("wait ready\ntap cancelButton\n");
        expectNormalEnd(run, round);
        EXPECT_EQ(run.hostReport, "[]") << "round " << round;
    }
}

TEST_P(RepeatedUse, TheTypicalUse) {
    for (int round = 0; round < kTypicalUsePerBatch; ++round) {
        const Run run = edit(R"(
wait ready
tap videoOverlayPlayButton
wait playing
wait paused 30
drag end 1.2
tap playButton
wait playing
wait paused 30
tap videoOverlay
sleep 0.2
tap trimButton
wait exporting=false 30
tap doneButton
)");
        expectNormalEnd(run, round);
        EXPECT_EQ(run.hostReport, kSavedToAlbumReport) << "round " << round;
        // Done the instant the save finished: the tear-down's removal of the
        // clip must not overtake the album's import of it.
        EXPECT_EQ(albumFiles().size(), round + 1) << "round " << round;
        expectWholeClipsOnly(1.2);
        EXPECT_TRUE(tempFiles().isEmpty()) << "round " << round;
    }
}

INSTANTIATE_TEST_SUITE_P(Batches, RepeatedUse, ::testing::Range(0, kBatches));
