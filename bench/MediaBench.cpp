// Benchmarks of the media engine on recordings that bench/run makes once and
// caches. Paths come from the environment:
//   TAMSEL_BENCH_LONG   a ten-minute 1080p60 recording
//   TAMSEL_BENCH_720P   a one-minute 720p30 recording
//   TAMSEL_BENCH_OUT    a scratch directory for outputs
// Each benchmark reports the process's peak resident memory as peak_rss_mb;
// bench/run runs each in a process of its own so the figure is its own.

#include "platform/media/Asset.h"
#include "platform/media/ExportSession.h"
#include "platform/media/ImageGenerator.h"
#include "platform/media/playback/Player.h"
#include "platform/media/playback/PlayerItem.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <benchmark/benchmark.h>
#include <sys/resource.h>
#include <unistd.h>

#include <algorithm>
#include <condition_variable>
#include <cstdlib>
#include <mutex>

using namespace platform;

namespace {

QString env(const char* name) {
    return QString::fromLocal8Bit(qgetenv(name));
}

double peakRssMb() {
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    return usage.ru_maxrss / 1024.0;
}

bool needs(benchmark::State& state, const QString& path) {
    if (path.isEmpty() || !QFileInfo::exists(path)) {
        state.SkipWithError("recording missing: run bench/run");
        return false;
    }
    return true;
}

// Runs an export to its completion; false when it did not complete.
bool exportNow(const std::shared_ptr<ExportSession>& session) {
    std::mutex m;
    std::condition_variable cv;
    bool done = false;
    session->exportAsynchronouslyWithCompletionHandler([&] {
        std::lock_guard lock(m);
        done = true;
        cv.notify_all();
    });
    std::unique_lock lock(m);
    cv.wait(lock, [&] { return done; });
    return session->status() == int(ExportSessionStatus::Completed);
}

// The middle half of the long recording, copied without re-encoding.
void BM_PassthroughExportMiddleHalf(benchmark::State& state) {
    const QString source = env("TAMSEL_BENCH_LONG");
    if (!needs(state, source))
        return;
    const QString output = QDir(env("TAMSEL_BENCH_OUT")).filePath("passthrough.mp4");
    const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(source));
    const double seconds = asset->duration().seconds();
    for (auto _ : state) {
        // Freeing the last run's blocks is not part of an export (and a
        // rename over a file makes the file system flush the new one first).
        state.PauseTiming();
        QFile::remove(output);
        ::sync();
        state.ResumeTiming();
        auto session =
            ExportSession::exportSessionWithAsset_presetName(asset, ExportPresetPassthrough);
        session->setOutputURL(QUrl::fromLocalFile(output));
        session->setOutputFileType(FileTypeMPEG4);
        session->setTimeRange(MediaTimeRange::make(MediaTime::fromSeconds(seconds / 4, 600),
                                                   MediaTime::fromSeconds(seconds / 2, 600)));
        if (!exportNow(session)) {
            state.SkipWithError("export failed");
            return;
        }
    }
    state.counters["output_mb"] = QFileInfo(output).size() / 1e6;
    state.counters["peak_rss_mb"] = peakRssMb();
}

// From a URL to a player item that is ready to play.
void BM_OpenToReady(benchmark::State& state) {
    const QString source = env("TAMSEL_BENCH_LONG");
    if (!needs(state, source))
        return;
    for (auto _ : state) {
        auto item = PlayerItem::playerItemWithURL(QUrl::fromLocalFile(source));
        auto player = Player::playerWithPlayerItem(item);
        while (item->status() == PlayerItem::Status::Unknown)
            QCoreApplication::processEvents(QEventLoop::AllEvents, 5);
        if (item->status() != PlayerItem::Status::ReadyToPlay) {
            state.SkipWithError("the item failed");
            return;
        }
        state.PauseTiming();
        player.reset();
        item.reset();
        QCoreApplication::processEvents();
        state.ResumeTiming();
    }
    state.counters["peak_rss_mb"] = peakRssMb();
}

// Reading the headers alone.
void BM_AssetOpen(benchmark::State& state) {
    const QString source = env("TAMSEL_BENCH_LONG");
    if (!needs(state, source))
        return;
    for (auto _ : state) {
        auto asset = Asset::assetWithURL(QUrl::fromLocalFile(source));
        benchmark::DoNotOptimize(asset->tracks().size());
    }
    state.counters["peak_rss_mb"] = peakRssMb();
}

// Twenty thumbnails spread over the long recording, at the size the editor's
// strip asks for, through a fresh generator each time (as after a load).
void BM_Thumbnails20(benchmark::State& state) {
    const QString source = env("TAMSEL_BENCH_LONG");
    if (!needs(state, source))
        return;
    const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(source));
    const double seconds = asset->duration().seconds();
    QList<MediaTime> times;
    for (int i = 0; i < 20; ++i)
        times.append(MediaTime::fromSeconds(seconds * i / 20, 600));
    for (auto _ : state) {
        auto generator = ImageGenerator::imageGeneratorWithAsset(asset);
        generator->setMaximumSize(QSizeF(68, 38));
        std::mutex m;
        std::condition_variable cv;
        int done = 0, failed = 0;
        generator->generateImagesAsynchronouslyForTimes_completionHandler(
            times, [&](MediaTime, QImage, MediaTime, ImageGeneratorResult result, ErrorPtr) {
                std::lock_guard lock(m);
                ++done;
                failed += result != ImageGeneratorResult::Succeeded;
                cv.notify_all();
            });
        std::unique_lock lock(m);
        cv.wait(lock, [&] { return done == 20; });
        if (failed) {
            state.SkipWithError("a thumbnail failed");
            return;
        }
    }
    state.counters["peak_rss_mb"] = peakRssMb();
}

// The highest-quality preset over the whole 720p30 minute.
void BM_ReencodeHighestQuality(benchmark::State& state) {
    const QString source = env("TAMSEL_BENCH_720P");
    if (!needs(state, source))
        return;
    const QString output = QDir(env("TAMSEL_BENCH_OUT")).filePath("reencode.mp4");
    const auto asset = Asset::assetWithURL(QUrl::fromLocalFile(source));
    const auto video = asset->tracksWithMediaType(MediaType::Video);
    const double frames =
        video.isEmpty() ? 0 : video.first().nominalFrameRate * asset->duration().seconds();
    for (auto _ : state) {
        state.PauseTiming();
        QFile::remove(output);
        ::sync();
        state.ResumeTiming();
        auto session =
            ExportSession::exportSessionWithAsset_presetName(asset, ExportPresetHighestQuality);
        session->setOutputURL(QUrl::fromLocalFile(output));
        session->setOutputFileType(FileTypeMPEG4);
        if (!exportNow(session)) {
            state.SkipWithError("export failed");
            return;
        }
    }
    state.counters["fps"] =
        benchmark::Counter(frames * state.iterations(), benchmark::Counter::kIsRate);
    state.counters["peak_rss_mb"] = peakRssMb();
}

// Each figure is the best of several runs, each run one iteration: on a
// shared machine the best run is the one the neighbours disturbed least.
double fastest(const std::vector<double>& runs) {
    return runs.empty() ? 0 : *std::min_element(runs.begin(), runs.end());
}

// For the memory counter: the process's peak over all runs.
double largest(const std::vector<double>& runs) {
    return runs.empty() ? 0 : *std::max_element(runs.begin(), runs.end());
}

void bestOf(benchmark::internal::Benchmark* b, int runs) {
    b->Unit(benchmark::kMillisecond)->UseRealTime()->Iterations(1);
    if (runs > 1)
        b->Repetitions(runs)
            ->ComputeStatistics("min", fastest)
            ->ComputeStatistics("max", largest)
            ->ReportAggregatesOnly(true);
}

BENCHMARK(BM_PassthroughExportMiddleHalf)->Apply([](auto* b) { bestOf(b, 5); });
BENCHMARK(BM_OpenToReady)->Apply([](auto* b) { bestOf(b, 5); });
BENCHMARK(BM_AssetOpen)->Apply([](auto* b) { bestOf(b, 10); });
BENCHMARK(BM_Thumbnails20)->Apply([](auto* b) { bestOf(b, 3); });
BENCHMARK(BM_ReencodeHighestQuality)->Apply([](auto* b) { bestOf(b, 1); });

} // namespace

int main(int argc, char** argv) {
    QCoreApplication app(argc, argv);
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
