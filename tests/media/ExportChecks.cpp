#include "ExportChecks.h"

#include "platform/media/Asset.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <condition_variable>
#include <mutex>

using namespace platform;

namespace mediatest {

bool ExportRun::runAndWait(int timeoutMs) {
    std::mutex m;
    std::condition_variable cv;
    session->exportAsynchronouslyWithCompletionHandler([&] {
        std::lock_guard lock(m);
        ++completions;
        completionThread = std::this_thread::get_id();
        cv.notify_all();
    });
    std::unique_lock lock(m);
    return cv.wait_for(lock, std::chrono::milliseconds(timeoutMs), [&] { return completions > 0; });
}

std::shared_ptr<ExportSession> makeSession(std::shared_ptr<Asset> asset, const QString& output,
                                           double start, double duration, const QString& preset) {
    auto session = ExportSession::exportSessionWithAsset_presetName(std::move(asset), preset);
    session->setOutputURL(QUrl::fromLocalFile(output));
    session->setOutputFileType(FileTypeMPEG4);
    session->setTimeRange(MediaTimeRange::make(MediaTime::fromSeconds(start, 600),
                                               MediaTime::fromSeconds(duration, 600)));
    return session;
}

std::shared_ptr<ExportSession> makeSession(const QString& source, const QString& output,
                                           double start, double duration, const QString& preset) {
    return makeSession(Asset::assetWithURL(QUrl::fromLocalFile(source)), output, start, duration,
                       preset);
}

testing::AssertionResult completes(ExportRun& run, int timeoutMs) {
    if (!run.runAndWait(timeoutMs))
        return testing::AssertionFailure() << "no completion";
    if (run.session->status() == int(ExportSessionStatus::Completed))
        return testing::AssertionSuccess();
    const ErrorPtr error = run.session->error();
    return testing::AssertionFailure() << "status " << run.session->status() << ": "
                                       << (error ? error->description().toStdString() : "");
}

testing::AssertionResult completes(const std::shared_ptr<ExportSession>& session, int timeoutMs) {
    ExportRun run{session};
    return completes(run, timeoutMs);
}

bool leftovers(const QString& output) {
    const QFileInfo info(output);
    return !QDir(info.absolutePath())
                .entryList({QStringLiteral(".") + info.fileName() + QStringLiteral("*")},
                           QDir::Files | QDir::Hidden)
                .isEmpty();
}

void expectFaithfulCut(const testmedia::MovieSpec& movieSpec, const QString& source,
                       const QString& output, double start, double duration, bool mixed) {
    // Everything is measured on the source's own timeline, as its demuxer
    // (and so a player) reports it: the movie counts from its earliest
    // sample, which may lie before the first frame.
    const ClipInfo original = probeClip(source);
    ASSERT_FALSE(original.frames.empty());
    const double frame = 1.0 / movieSpec.fps;
    const double from = start + original.startTime;
    const ShownFrame* first = &original.frames.front();
    for (const ShownFrame& f : original.frames)
        if (f.seconds <= from + 1e-6)
            first = &f;
    const double end = std::min(from + duration, original.frames.back().seconds + frame);
    const ShownFrame* last = first;
    for (const ShownFrame& f : original.frames)
        if (f.seconds < end - 1e-6)
            last = &f;
    // The clip starts with the picture shown at the start, at its own time.
    const double clipZero = first->seconds;

    const ClipInfo clip = probeClip(output);
    ASSERT_TRUE(clip.opened);
    EXPECT_TRUE(clip.format.contains(QLatin1String("mp4"))) << clip.format.toStdString();
    EXPECT_EQ(clip.errorLines, 0);
    EXPECT_TRUE(clip.decodeTimesRise);
    EXPECT_EQ(clip.transform, original.transform);
    EXPECT_FALSE(leftovers(output));
    ASSERT_FALSE(clip.frames.empty());
    EXPECT_NEAR(clip.frames.front().seconds, 0.0, 1e-3);
    EXPECT_EQ(clip.frames.front().index, first->index);
    EXPECT_NEAR(clip.videoDuration, end - clipZero, frame);
    EXPECT_EQ(clip.frames.back().index, last->index);
    for (size_t i = 1; i < clip.frames.size(); ++i)
        EXPECT_GT(clip.frames[i].index, clip.frames[i - 1].index) << "at " << i;
    if (!movieSpec.audio) {
        EXPECT_EQ(clip.audioTracks, 0);
        return;
    }
    ASSERT_EQ(clip.audioTracks, mixed ? 1 : movieSpec.audioTracks);
    // As long as the video, unless the recording's audio starts later or
    // stops earlier.
    EXPECT_NEAR(clip.audioDuration,
                std::min(end, original.audioEnd) - std::max(clipZero, original.audioStart), frame);
    // Each burst of the source inside the clip is heard at its place (the
    // microphone's too, half a second later, when it is mixed in).
    // A burst that began just before the clip is heard from its start.
    std::vector<double> expected;
    for (double onset : original.burstOnsets)
        for (double at : {onset, onset + testmedia::kSecondTrackBurstOffset})
            if ((at == onset || mixed) && at > clipZero - testmedia::kBurstSeconds / 2 &&
                at < end - 0.02)
                expected.push_back(std::max(0.0, at - clipZero));
    std::sort(expected.begin(), expected.end());
    ASSERT_EQ(clip.burstOnsets.size(), expected.size())
        << testing::PrintToString(clip.burstOnsets) << " against "
        << testing::PrintToString(expected);
    for (size_t i = 0; i < expected.size(); ++i)
        EXPECT_NEAR(clip.burstOnsets[i], expected[i], 0.005) << "burst " << i;
}

} // namespace mediatest
