// The image generator's scaling, cancellation and exact requests; its strip
// (keyframes, the editor's default) on every kind of recording is checked in
// RecordingKindsTest, its failures in MediaOpeningTest.

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
    // Later requests are served, off the main thread, exactly when asked for
    // (the frame shown at the time, not a keyframe).
    const auto after = generate(*generator, {1.9, 3.99});
    ASSERT_EQ(after.size(), 2u);
    for (const Completion& c : after) {
        EXPECT_EQ(c.result, ImageGeneratorResult::Succeeded);
        EXPECT_FALSE(c.error);
        EXPECT_NE(c.thread, std::this_thread::get_id());
    }
    EXPECT_EQ(after[0].requested, MediaTime::fromSeconds(1.9, 600));
    EXPECT_EQ(testmedia::readFrameIndex(after[0].image), 57);
    EXPECT_EQ(testmedia::readFrameIndex(after[1].image), 119);
    EXPECT_NEAR(after[1].actual.seconds(), 119 / 30.0, 1e-6);
}
