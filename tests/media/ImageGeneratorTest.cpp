// The image generator's tolerances, scaling and cancellation; its strip on
// every kind of recording is checked in RecordingKindsTest, its failures in
// MediaOpeningTest.

#include "platform/media/ImageGenerator.h"
#include "MediaFixtures.h"

#include <gtest/gtest.h>

#include <condition_variable>
#include <functional>
#include <mutex>
#include <thread>
#include <vector>

using namespace platform;
using mediatest::movieFor;

namespace {

struct Completion {
    MediaTime requested;
    QImage image;
    MediaTime actual;
    ImageGeneratorResult result;
    ErrorPtr error;
    std::thread::id thread;
};

// Requests the times, does `meanwhile`, and waits for all their completions.
std::vector<Completion> generate(ImageGenerator& generator, const QList<double>& seconds,
                                 const std::function<void()>& meanwhile = nullptr) {
    std::mutex m;
    std::condition_variable cv;
    std::vector<Completion> done;
    QList<MediaTime> times;
    for (double s : seconds)
        times.append(MediaTime::fromSeconds(s, 600));
    generator.generateImagesAsynchronouslyForTimes_completionHandler(
        times, [&](MediaTime requested, QImage image, MediaTime actual, ImageGeneratorResult result,
                   ErrorPtr error) {
            std::lock_guard lock(m);
            done.push_back({requested, image, actual, result, error, std::this_thread::get_id()});
            cv.notify_all();
        });
    if (meanwhile)
        meanwhile();
    std::unique_lock lock(m);
    cv.wait_for(lock, std::chrono::seconds(60),
                [&] { return done.size() >= size_t(times.size()); });
    return done;
}

std::shared_ptr<ImageGenerator> generatorFor(const testmedia::MovieSpec& movieSpec) {
    return ImageGenerator::imageGeneratorWithAsset(
        Asset::assetWithURL(QUrl::fromLocalFile(movieFor(movieSpec))));
}

} // namespace

// By default the keyframe at or before each time (past the end: the last
// one); with no tolerance the frame shown at the time. With reordered frames
// too, where a keyframe is shown after it is decoded.
TEST(ImageGenerator, GivesTheKeyframeByDefaultAndTheShownFrameWithoutTolerance) {
    const QList<double> times = {0.0, 1.0, 1.9, 2.5, 3.99, 60.0};
    const struct {
        int bFrames;
        bool exact;
        std::vector<int> expected;
    } cases[] = {{0, false, {0, 30, 30, 60, 90, 90}},
                 {2, false, {0, 30, 30, 60, 90, 90}},
                 {2, true, {0, 30, 57, 75, 119, 119}}};
    for (const auto& c : cases) {
        SCOPED_TRACE(testing::Message() << c.bFrames << " B-frames, exact " << c.exact);
        auto generator = generatorFor({.seconds = 4, .bFrames = c.bFrames});
        if (c.exact) {
            generator->setRequestedTimeToleranceBefore(MediaTime::zero());
            generator->setRequestedTimeToleranceAfter(MediaTime::zero());
        }
        const auto done = generate(*generator, times);
        ASSERT_EQ(done.size(), size_t(times.size()));
        for (size_t i = 0; i < done.size(); ++i) {
            SCOPED_TRACE(times[int(i)]);
            EXPECT_EQ(done[i].result, ImageGeneratorResult::Succeeded);
            EXPECT_FALSE(done[i].error);
            EXPECT_EQ(done[i].requested, MediaTime::fromSeconds(times[int(i)], 600));
            EXPECT_EQ(testmedia::readFrameIndex(done[i].image), c.expected[i]);
            EXPECT_NEAR(done[i].actual.seconds(), c.expected[i] / 30.0, 1e-6);
            EXPECT_NE(done[i].thread, std::this_thread::get_id());
        }
    }
}

TEST(ImageGenerator, ScalesIntoTheMaximumSizeKeepingTheAspectAndTurnsWhenAsked) {
    auto generator = generatorFor({.height = 180, .rotationDegrees = 90});
    generator->setMaximumSize(QSizeF(64, 64));
    auto done = generate(*generator, {1.0});
    ASSERT_EQ(done.size(), 1u);
    EXPECT_EQ(done[0].image.size(), QSize(64, 36));
    EXPECT_EQ(testmedia::readFrameIndex(done[0].image), 30);
    // A side that is not a number (no video size known) does not constrain.
    generator->setMaximumSize(QSizeF(qQNaN(), 90));
    done = generate(*generator, {0.0});
    EXPECT_EQ(done[0].image.size(), QSize(160, 90));

    generator->setMaximumSize(QSizeF(90, 160));
    generator->setAppliesPreferredTrackTransform(true);
    done = generate(*generator, {0.0});
    EXPECT_EQ(done[0].image.size(), QSize(90, 160));
    // Turned back, the code reads again.
    EXPECT_EQ(testmedia::readFrameIndex(done[0].image.transformed(QTransform().rotate(-90))), 0);
}

TEST(ImageGenerator, CancelCompletesWhatIsPendingAsCancelledAndLaterRequestsAreServed) {
    auto generator = generatorFor({.seconds = 4, .keyframeInterval = 120});
    generator->setRequestedTimeToleranceBefore(MediaTime::zero());
    generator->setRequestedTimeToleranceAfter(MediaTime::zero());
    const auto done = generate(*generator, QList<double>(40, 3.9),
                               [&] { generator->cancelAllImageGeneration(); });
    ASSERT_EQ(done.size(), 40u);
    int cancelled = 0;
    for (const Completion& c : done) {
        cancelled += c.result == ImageGeneratorResult::Cancelled;
        EXPECT_EQ(c.image.isNull(), c.result != ImageGeneratorResult::Succeeded);
    }
    // At most the one already under way finishes.
    EXPECT_GE(cancelled, 39);
    const auto after = generate(*generator, {1.0});
    ASSERT_EQ(after.size(), 1u);
    EXPECT_EQ(after[0].result, ImageGeneratorResult::Succeeded);
}
