// Opening a movie never waits on a file that does not answer: what is not a
// regular file is refused before anything reads it, and the headers are read
// within a bound.

#include "platform/media/Asset.h"
#include "platform/media/ExportSession.h"
#include "platform/media/ImageGenerator.h"
#include "platform/runtime/Bounded.h"

#include <QDir>
#include <QFile>
#include <QTemporaryDir>
#include <QUrl>
#include <atomic>
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
std::shared_ptr<Asset> openOrGiveUp(const QString& path) {
    auto result = std::make_shared<std::promise<std::shared_ptr<Asset>>>();
    auto future = result->get_future();
    std::thread([result, path] {
        result->set_value(Asset::assetWithURL(QUrl::fromLocalFile(path)));
    }).detach();
    if (future.wait_for(std::chrono::seconds(30)) != std::future_status::ready)
        return nullptr;
    return future.get();
}

} // namespace

TEST(MediaOpening, WhatIsNotARegularFileIsRefusedBeforeAnythingReadsIt) {
    QTemporaryDir dir;
    const QString fifo = dir.filePath("pipe.mp4");
    ASSERT_EQ(::mkfifo(QFile::encodeName(fifo).constData(), 0600), 0);
    // A pipe with a writer that never writes: opening it does not wait, its
    // reads would wait forever.
    const QString stalled = dir.filePath("stalled.mp4");
    ASSERT_EQ(::mkfifo(QFile::encodeName(stalled).constData(), 0600), 0);
    const int writer = ::open(QFile::encodeName(stalled).constData(), O_RDWR | O_CLOEXEC);
    ASSERT_GE(writer, 0);

    for (const QString& path : {fifo, stalled, QStringLiteral("/dev/zero"), dir.path()}) {
        const auto asset = openOrGiveUp(path);
        ASSERT_TRUE(asset) << path.toStdString() << " hung";
        EXPECT_TRUE(asset->tracks().isEmpty()) << path.toStdString();
        ASSERT_TRUE(asset->error()) << path.toStdString();
        EXPECT_TRUE(asset->error()->message().contains("not a regular file"))
            << asset->error()->message().toStdString();
    }
    ::close(writer);
}

TEST(MediaOpening, AnEmptyOrMissingFileFailsWithItsReason) {
    QTemporaryDir dir;
    QFile empty(dir.filePath("empty.mp4"));
    ASSERT_TRUE(empty.open(QIODevice::WriteOnly));
    empty.close();
    const auto emptyAsset = openOrGiveUp(empty.fileName());
    ASSERT_TRUE(emptyAsset);
    EXPECT_TRUE(emptyAsset->tracks().isEmpty());
    EXPECT_TRUE(emptyAsset->error());

    const auto missing = openOrGiveUp(dir.filePath("missing.mp4"));
    ASSERT_TRUE(missing);
    ASSERT_TRUE(missing->error());
    EXPECT_TRUE(missing->error()->message().contains("No such file"))
        << missing->error()->message().toStdString();
}

TEST(MediaOpening, ThumbnailsAndExportsOfARefusedMovieFailWithoutWaiting) {
    QTemporaryDir dir;
    const QString fifo = dir.filePath("pipe.mp4");
    ASSERT_EQ(::mkfifo(QFile::encodeName(fifo).constData(), 0600), 0);
    const auto asset = openOrGiveUp(fifo);
    ASSERT_TRUE(asset);

    std::promise<ImageGeneratorResult> imaged;
    ImageGenerator::imageGeneratorWithAsset(asset)
        ->generateImagesAsynchronouslyForTimes_completionHandler(
            {MediaTime::fromSeconds(0, 600)},
            [&](MediaTime, QImage, MediaTime, ImageGeneratorResult result, ErrorPtr) {
                imaged.set_value(result);
            });
    auto image = imaged.get_future();
    ASSERT_EQ(image.wait_for(std::chrono::seconds(30)), std::future_status::ready);
    EXPECT_EQ(image.get(), ImageGeneratorResult::Failed);

    const auto session =
        ExportSession::exportSessionWithAsset_presetName(asset, ExportPresetPassthrough);
    session->setOutputURL(QUrl::fromLocalFile(dir.filePath("clip.mp4")));
    session->setOutputFileType(FileTypeMPEG4);
    std::promise<void> exported;
    session->exportAsynchronouslyWithCompletionHandler([&] { exported.set_value(); });
    ASSERT_EQ(exported.get_future().wait_for(std::chrono::seconds(30)), std::future_status::ready);
    EXPECT_EQ(session->status(), int(ExportSessionStatus::Failed));
    EXPECT_FALSE(QFile::exists(dir.filePath("clip.mp4")));
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
