// Opening a movie never waits on a file that does not answer: what is not a
// regular file is refused before anything reads it, and the headers are read
// within a bound.

#include "ExportChecks.h"
#include "MediaFixtures.h"
#include "platform/media/Asset.h"
#include "platform/media/ExportSession.h"
#include "platform/media/ImageGenerator.h"
#include "platform/runtime/Bounded.h"

#include <QFile>
#include <QTemporaryDir>
#include <QUrl>
#include <fcntl.h>
#include <future>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>

using namespace platform;

namespace {

// Opens the asset on a thread of the test's own, so a hang fails the test
// instead of stopping it; null when it did not come back.
std::shared_ptr<Asset> openOrGiveUp(const QUrl& url) {
    auto result = std::make_shared<std::promise<std::shared_ptr<Asset>>>();
    auto future = result->get_future();
    std::thread([result, url] { result->set_value(Asset::assetWithURL(url)); }).detach();
    if (future.wait_for(std::chrono::seconds(30)) != std::future_status::ready)
        return nullptr;
    return future.get();
}

} // namespace

TEST(MediaOpening, WhatIsNotAMovieGivesNoTracksAndItsReasonWithoutWaiting) {
    QTemporaryDir dir;
    const QString fifo = dir.filePath("pipe.mp4");
    ASSERT_EQ(::mkfifo(QFile::encodeName(fifo).constData(), 0600), 0);
    // A pipe with a writer that never writes: opening it does not wait, its
    // reads would wait forever.
    const QString stalled = dir.filePath("stalled.mp4");
    ASSERT_EQ(::mkfifo(QFile::encodeName(stalled).constData(), 0600), 0);
    const int writer = ::open(QFile::encodeName(stalled).constData(), O_RDWR | O_CLOEXEC);
    ASSERT_GE(writer, 0);
    QFile text(dir.filePath("readme.mov")), empty(dir.filePath("empty.mp4"));
    ASSERT_TRUE(text.open(QIODevice::WriteOnly) && empty.open(QIODevice::WriteOnly));
    text.write(QByteArray(4096, 'x'));
    text.close();
    empty.close();

    const QString notRegular = QStringLiteral("not a regular file");
    const std::pair<QUrl, QString> cases[] = {
        {QUrl::fromLocalFile(fifo), notRegular},
        {QUrl::fromLocalFile(stalled), notRegular},
        {QUrl::fromLocalFile(QStringLiteral("/dev/zero")), notRegular},
        {QUrl::fromLocalFile(dir.path()), notRegular},
        {QUrl::fromLocalFile(dir.filePath("missing.mp4")), QStringLiteral("No such file")},
        {QUrl::fromLocalFile(empty.fileName()), {}},
        {QUrl::fromLocalFile(text.fileName()), {}},
        {QUrl::fromLocalFile(mediatest::movieFor({.truncated = true})), {}},
        {QUrl(QStringLiteral("https://example.invalid/movie.mp4")), {}},
        {QUrl(), {}},
    };
    for (const auto& [url, reason] : cases) {
        SCOPED_TRACE(url.toString().toStdString());
        const auto asset = openOrGiveUp(url);
        ASSERT_TRUE(asset) << "hung";
        EXPECT_TRUE(asset->tracks().isEmpty());
        ASSERT_TRUE(asset->error());
        EXPECT_NE(asset->error()->code(), 0);
        EXPECT_TRUE(asset->error()->message().contains(reason))
            << asset->error()->message().toStdString();
        EXPECT_FALSE(asset->isPlayable());
        EXPECT_FALSE(asset->duration().isValid());
        EXPECT_EQ(asset->url(), url);

        // Its thumbnails, either way, and its exports fail with their
        // errors, without waiting either.
        auto generator = ImageGenerator::imageGeneratorWithAsset(asset);
        std::promise<bool> imaged;
        generator->generateImagesAsynchronouslyForTimes_completionHandler(
            {MediaTime::zero()},
            [&](MediaTime, QImage image, MediaTime, ImageGeneratorResult result, ErrorPtr error) {
                imaged.set_value(result == ImageGeneratorResult::Failed && image.isNull() &&
                                 error && error->code() != 0);
            });
        auto image = imaged.get_future();
        ASSERT_EQ(image.wait_for(std::chrono::seconds(30)), std::future_status::ready);
        EXPECT_TRUE(image.get());
        MediaTime actual;
        ErrorPtr error;
        EXPECT_TRUE(generator->copyImageAtTime_actualTime_error(MediaTime::zero(), &actual, &error)
                        .isNull());
        EXPECT_TRUE(error);
        const QString output = dir.filePath("clip.mp4");
        mediatest::ExportRun run{mediatest::makeSession(asset, output, 0, 1)};
        ASSERT_TRUE(run.runAndWait(30000));
        EXPECT_EQ(run.completions, 1);
        EXPECT_EQ(run.session->status(), int(ExportSessionStatus::Failed));
        EXPECT_NE(run.session->error() ? run.session->error()->code() : 0, 0);
        EXPECT_FALSE(QFile::exists(output));
        EXPECT_FALSE(mediatest::leftovers(output));
    }
    ::close(writer);
}

TEST(Bounded, WorkThatDoesNotAnswerIsGivenUpAndWorkThatDoesIsAwaited) {
    int fds[2];
    ASSERT_EQ(::pipe2(fds, O_CLOEXEC), 0);
    // A read that would wait forever: nobody writes.
    const auto stalled = runWithin<int>(std::chrono::milliseconds(200), [fd = fds[0]] {
        char byte;
        return int(::read(fd, &byte, 1));
    });
    EXPECT_FALSE(stalled.has_value());
    EXPECT_EQ(runWithin<int>(std::chrono::seconds(30), [] { return 7; }), 7);
    // The abandoned read ends when its pipe does; its result goes nowhere.
    ::close(fds[1]);
}
