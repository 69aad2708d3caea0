#include "platform/media/ImageGenerator.h"
#include "MediaFixtures.h"

#include <QThread>
#include <gtest/gtest.h>

#include <condition_variable>
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

// Requests the times and waits for all their completions.
std::vector<Completion> generate(ImageGenerator& generator, const QList<double>& seconds) {
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

TEST(ImageGenerator, DefaultToleranceGivesTheKeyframeAtOrBeforeEachTime) {
    // With reordered frames too, where a keyframe is shown after it is decoded.
    for (int bFrames : {0, 2}) {
        SCOPED_TRACE(bFrames);
        testmedia::MovieSpec movieSpec;
        movieSpec.seconds = 4;
        movieSpec.keyframeInterval = 30;
        movieSpec.bFrames = bFrames;
        auto generator = generatorFor(movieSpec);
        // 1.9 s is frame 57: keyframe 30. Past the end: the last keyframe, 90.
        const QList<double> times = {0.0, 1.0, 1.9, 3.99, 4.0, 60.0};
        const auto done = generate(*generator, times);
        ASSERT_EQ(done.size(), 6u);
        const int expected[] = {0, 30, 30, 90, 90, 90};
        for (size_t i = 0; i < done.size(); ++i) {
            SCOPED_TRACE(i);
            EXPECT_EQ(done[i].result, ImageGeneratorResult::Succeeded);
            EXPECT_FALSE(done[i].error);
            EXPECT_EQ(done[i].requested, MediaTime::fromSeconds(times[int(i)], 600));
            EXPECT_EQ(testmedia::readFrameIndex(done[i].image), expected[i]);
            EXPECT_NEAR(done[i].actual.seconds(), expected[i] / 30.0, 1e-6);
            EXPECT_NE(done[i].thread, std::this_thread::get_id());
        }
    }
}

TEST(ImageGenerator, ZeroToleranceGivesTheFrameShownAtTheTime) {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 3;
    movieSpec.keyframeInterval = 60;
    movieSpec.bFrames = 2;
    auto generator = generatorFor(movieSpec);
    generator->setRequestedTimeToleranceBefore(MediaTime::zero());
    generator->setRequestedTimeToleranceAfter(MediaTime::zero());
    const auto done = generate(*generator, {0.5, 1.99, 2.0, 2.5, 30.0});
    const int expected[] = {15, 59, 60, 75, 89};
    ASSERT_EQ(done.size(), 5u);
    for (size_t i = 0; i < done.size(); ++i)
        EXPECT_EQ(testmedia::readFrameIndex(done[i].image), expected[i]) << i;
}

TEST(ImageGenerator, ScalesIntoTheMaximumSizeKeepingTheAspectAndTurnsWhenAsked) {
    testmedia::MovieSpec movieSpec;
    movieSpec.width = 320;
    movieSpec.height = 180;
    movieSpec.rotationDegrees = 90;
    auto generator = generatorFor(movieSpec);
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

TEST(ImageGenerator, CancelCompletesWhatIsPendingAsCancelled) {
    testmedia::MovieSpec movieSpec;
    movieSpec.seconds = 4;
    movieSpec.keyframeInterval = 120;
    auto generator = generatorFor(movieSpec);
    generator->setRequestedTimeToleranceBefore(MediaTime::zero());
    generator->setRequestedTimeToleranceAfter(MediaTime::zero());
    std::mutex m;
    std::condition_variable cv;
    std::vector<ImageGeneratorResult> results;
    QList<MediaTime> times;
    for (int i = 0; i < 40; ++i)
        times.append(MediaTime::fromSeconds(3.9, 600));
    generator->generateImagesAsynchronouslyForTimes_completionHandler(
        times, [&](MediaTime, QImage image, MediaTime, ImageGeneratorResult result, ErrorPtr) {
            std::lock_guard lock(m);
            results.push_back(result);
            EXPECT_EQ(image.isNull(), result != ImageGeneratorResult::Succeeded);
            cv.notify_all();
        });
    generator->cancelAllImageGeneration();
    {
        std::unique_lock lock(m);
        ASSERT_TRUE(
            cv.wait_for(lock, std::chrono::seconds(60), [&] { return results.size() == 40u; }));
    }
    const auto cancelled =
        std::count(results.begin(), results.end(), ImageGeneratorResult::Cancelled);
    // At most the one already under way finishes.
    EXPECT_GE(cancelled, 39);
    // Later requests are served.
    const auto after = generate(*generator, {1.0});
    ASSERT_EQ(after.size(), 1u);
    EXPECT_EQ(after[0].result, ImageGeneratorResult::Succeeded);
}

TEST(ImageGenerator, FailsWithAnErrorWhenNoFrameCanBeDecoded) {
    testmedia::MovieSpec truncated;
    truncated.truncated = true;
    for (const QString& path : {movieFor(truncated), QStringLiteral("/no/such/file.mp4")}) {
        auto generator =
            ImageGenerator::imageGeneratorWithAsset(Asset::assetWithURL(QUrl::fromLocalFile(path)));
        const auto done = generate(*generator, {0.0, 1.0});
        ASSERT_EQ(done.size(), 2u);
        for (const Completion& c : done) {
            EXPECT_EQ(c.result, ImageGeneratorResult::Failed);
            EXPECT_TRUE(c.image.isNull());
            ASSERT_TRUE(c.error);
            EXPECT_NE(c.error->code(), 0);
        }
    }
    MediaTime actual;
    ErrorPtr error;
    auto generator = ImageGenerator::imageGeneratorWithAsset(
        Asset::assetWithURL(QUrl::fromLocalFile(movieFor(truncated))));
    EXPECT_TRUE(
        generator->copyImageAtTime_actualTime_error(MediaTime::zero(), &actual, &error).isNull());
    EXPECT_TRUE(error);
    // The synchronous path agrees with the asynchronous one on a good movie.
    generator = generatorFor(testmedia::MovieSpec{});
    const QImage image = generator->copyImageAtTime_actualTime_error(
        MediaTime::fromSeconds(1.5, 600), &actual, &error);
    EXPECT_EQ(testmedia::readFrameIndex(image), 30);
    EXPECT_EQ(actual, MediaTime::make(1, 1));
    EXPECT_FALSE(error);
}
