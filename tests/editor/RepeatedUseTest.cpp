// The way out, over and over: the editor opened and cancelled at once, and
// the typical use, again and again on the shortest recording, without one
// abnormal end. Each batch is a test of its own, so batches run side by side.

#include "EndToEndFixture.h"
#include "MediaGenerator.h"

#include <QDir>
#include <QJsonObject>

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

// Each round checks what the fakes cannot show: the real player's end, the
// range stopping at its end handle, the save switching to the clip.
TEST_P(RepeatedUse, TheTypicalUse) {
    const QByteArray original = hashOf(recording());
    for (int round = 0; round < kTypicalUsePerBatch; ++round) {
        SCOPED_TRACE(testing::Message() << "round " << round);
        const Run run = edit(R"(
wait ready
tap videoOverlayPlayButton
wait playing
wait paused 30
dump
drag end 1.2
tap playButton
wait playing
wait paused 30
dump
tap videoOverlay
sleep 0.2
tap trimButton
wait exporting=false 30
dump
tap doneButton
)");
        expectNormalEnd(run, round);
        ASSERT_EQ(run.dumps.size(), 3) << run.out.toStdString();
        const QJsonObject &ended = run.dumps[0], &range = run.dumps[1], &saved = run.dumps[2];
        EXPECT_FALSE(ended["introMode"].toBool() || ended["uiHidden"].toBool());
        EXPECT_NEAR(ended["currentTime"].toDouble(), 0.0, 0.05) << "back to zero at the end";
        EXPECT_TRUE(range["trimming"].toBool());
        EXPECT_NEAR(range["currentTime"].toDouble(), range["editEndTime"].toDouble(), 0.2);
        EXPECT_FALSE(saved["trimming"].toBool() || saved["exporting"].toBool());
        EXPECT_TRUE(
            saved["videoURL"].toString().startsWith("/private/var/mobile/Library/Tamsel//Racer_"));
        EXPECT_EQ(run.hostReport, kSavedToAlbumReport);
        // Done the instant the save finished: the tear-down's removal of the
        // clip must not overtake the album's import of it.
        EXPECT_EQ(albumFiles().size(), round + 1);
        expectWholeClipsOnly(1.2);
        EXPECT_TRUE(tempFiles().isEmpty()) << tempFiles().join(", ").toStdString();
    }
    EXPECT_EQ(hashOf(recording()), original) << "the host's movie is never modified";
}

INSTANTIATE_TEST_SUITE_P(Batches, RepeatedUse, ::testing::Range(0, kBatches));
