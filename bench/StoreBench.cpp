// Benchmarks of the store lookup's local source, the desktop's AppStream
// catalogue, on a catalogue that bench/run generates:
//   TAMSEL_BENCH_CATALOGUE  a folder holding one collection XML
//   TAMSEL_BENCH_APP_ID     an application in it (bench/run takes the last)
// The first lookup of a process loads the catalogue (libappstream keeps what
// it read for the rest of the process, so bench/run runs that one in a new
// process each time); later ones only query. Each reports the process's peak
// resident memory as peak_rss_mb.

#include "platform/services/store/AppStreamCatalogue.h"

#include <benchmark/benchmark.h>
#include <sys/resource.h>

#include <algorithm>
#include <cstdlib>

using namespace platform;

namespace {

QString fromEnvironment(const char* name) {
    const char* value = std::getenv(name);
    return value ? QString::fromLocal8Bit(value) : QString();
}

double peakRssMb() {
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    return usage.ru_maxrss / 1024.0;
}

void BM_AppStreamFirstLookup(benchmark::State& state) {
    const QString catalogue = fromEnvironment("TAMSEL_BENCH_CATALOGUE");
    const QString id = fromEnvironment("TAMSEL_BENCH_APP_ID");
    for (auto _ : state) {
        AppStreamCatalogue local({catalogue});
        if (!local.lookupNow(id))
            state.SkipWithError("the application is not in the catalogue");
    }
    state.counters["peak_rss_mb"] = peakRssMb();
}

void BM_AppStreamLoadedLookup(benchmark::State& state) {
    AppStreamCatalogue local({fromEnvironment("TAMSEL_BENCH_CATALOGUE")});
    const QString id = fromEnvironment("TAMSEL_BENCH_APP_ID");
    local.lookupNow(id);
    for (auto _ : state)
        if (!local.lookupNow(id))
            state.SkipWithError("the application is not in the catalogue");
    state.counters["peak_rss_mb"] = peakRssMb();
}

double fastest(const std::vector<double>& runs) {
    return *std::min_element(runs.begin(), runs.end());
}

double slowest(const std::vector<double>& runs) {
    return *std::max_element(runs.begin(), runs.end());
}

void spread(benchmark::internal::Benchmark* b, int runs, benchmark::TimeUnit unit) {
    b->Unit(unit)
        ->UseRealTime()
        ->Iterations(1)
        ->Repetitions(runs)
        ->ComputeStatistics("min", fastest)
        ->ComputeStatistics("max", slowest)
        ->ReportAggregatesOnly(true);
}

} // namespace

BENCHMARK(BM_AppStreamFirstLookup)->Unit(benchmark::kMillisecond)->UseRealTime()->Iterations(1);
BENCHMARK(BM_AppStreamLoadedLookup)->Apply([](auto* b) { spread(b, 50, benchmark::kMicrosecond); });

BENCHMARK_MAIN();
