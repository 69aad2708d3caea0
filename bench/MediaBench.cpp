// In-process benchmarks of the media engine, for the figures that have no
// command-line peer (the export and the thumbnails are timed as whole
// processes, tamsel-bench-export, beside cp and ffmpeg). The recording
// comes from the environment:
//   TAMSEL_BENCH_LONG   a ten-minute 1080p60 recording
// Each benchmark reports the process's peak resident memory as peak_rss_mb;
// bench/run runs each in a process of its own so the figure is its own.

#include "platform/media/Asset.h"
#include "platform/media/playback/Player.h"
#include "platform/media/playback/PlayerItem.h"

#include <QCoreApplication>
#include <QFileInfo>
#include <benchmark/benchmark.h>
#include <sys/resource.h>

#include <algorithm>

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

BENCHMARK(BM_OpenToReady)->Apply([](auto* b) { bestOf(b, 5); });
BENCHMARK(BM_AssetOpen)->Apply([](auto* b) { bestOf(b, 10); });

} // namespace

int main(int argc, char** argv) {
    QCoreApplication app(argc, argv);
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
