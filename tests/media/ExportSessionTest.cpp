// The export session's failures, cancellation and sources that go away; the
// clips it writes from every kind of recording are checked in
// RecordingKindsTest.

#include "platform/media/ExportSession.h"
#include "ExportChecks.h"
#include "MediaFixtures.h"
#include "platform/media/Asset.h"
#include "platform/media/ImageGenerator.h"

#include <QFile>
#include <gtest/gtest.h>

#include <future>
#include <thread>

using namespace platform;
using namespace mediatest;

// What is not a movie fails in MediaOpeningTest; a good movie fails too
// for a range past its end or an output folder that is not there.
TEST(ExportSessionFailures, FailCleanlyWithACodeAndLeaveNothing) {
    const QString source = movieFor({});
    for (const auto& [start, output] :
         {std::pair{5.0, scratchPath(QStringLiteral("past-the-end.mp4"))},
          std::pair{0.0, scratchPath(QStringLiteral("no/out.mp4"))}}) {
        SCOPED_TRACE(output.toStdString());
        ExportRun run{makeSession(source, output, start, 1)};
        ASSERT_TRUE(run.runAndWait());
        EXPECT_EQ(run.session->status(), int(ExportSessionStatus::Failed));
        ASSERT_TRUE(run.session->error());
        EXPECT_NE(run.session->error()->code(), 0);
        EXPECT_FALSE(QFile::exists(output));
        EXPECT_FALSE(leftovers(output));
        EXPECT_EQ(run.completions, 1);
    }
    EXPECT_FALSE(ExportSession::exportSessionWithAsset_presetName(
        Asset::assetWithURL(QUrl::fromLocalFile(source)), QStringLiteral("no-such-preset")));
}

TEST(ExportSessionCancel, LeavesNoFileWhetherCancelledBeforeOrDuring) {
    const QString source = movieFor({.seconds = 8});
    for (const QString& preset : {ExportPresetPassthrough, ExportPresetHighestQuality}) {
        SCOPED_TRACE(preset.toStdString());
        const QString output = scratchPath(QStringLiteral("cancelled.mp4"));
        ExportRun early{makeSession(source, output, 0, 8, preset)};
        early.session->cancelExport();
        ASSERT_TRUE(early.runAndWait());
        EXPECT_EQ(early.session->status(), int(ExportSessionStatus::Cancelled));

        // Cancelled once the writer is under way (or, on a fast machine,
        // finished: then the export stands and the file is whole).
        const auto during = makeSession(source, output, 0, 8, preset);
        std::promise<void> done;
        during->exportAsynchronouslyWithCompletionHandler([&] { done.set_value(); });
        while (during->status() == int(ExportSessionStatus::Waiting))
            std::this_thread::yield();
        during->cancelExport();
        ASSERT_EQ(done.get_future().wait_for(std::chrono::seconds(60)), std::future_status::ready);
        if (during->status() == int(ExportSessionStatus::Cancelled))
            EXPECT_FALSE(QFile::exists(output));
        else
            EXPECT_EQ(during->status(), int(ExportSessionStatus::Completed));
        EXPECT_FALSE(leftovers(output));
    }
}

// The editor plays the clip it saved, removes it before the next save and
// exports the next clip from the same asset: the asset keeps reading it.
TEST(ExportSessionPassthrough, ExportsFromAnAssetWhoseFileWasRemoved) {
    const testmedia::MovieSpec movieSpec{.seconds = 3};
    const QString clip = scratchPath(QStringLiteral("saved-clip.mp4"));
    ASSERT_TRUE(QFile::copy(movieFor(movieSpec), clip));
    const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(clip));
    ASSERT_TRUE(QFile::remove(clip));
    for (int round = 1; round <= 3; ++round) {
        SCOPED_TRACE(round);
        const QString output = scratchPath(QStringLiteral("again.mp4"));
        ASSERT_TRUE(completes(makeSession(asset, output, 0.5 * round, 0.8)));
        expectFaithfulCut(movieSpec, movieFor(movieSpec), output, 0.5 * round, 0.8);
    }
    MediaTime actual;
    EXPECT_FALSE(
        ImageGenerator::imageGeneratorWithAsset(asset)
            ->copyImageAtTime_actualTime_error(MediaTime::fromSeconds(1, 600), &actual, nullptr)
            .isNull());
}
