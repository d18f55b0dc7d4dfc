// The simulated baseband's throughput: blobs generated per second of one core, for every technology that
// has a simulator in this build, by simulating whole minutes of a drive. Each run builds a fresh world
// (seed 1), simulates 120 s and counts the blobs; the "blobs/s" counter is the figure to watch, and
// "sim s per s" says how many times faster than real time the simulator runs.
#include <benchmark/benchmark.h>

#include <string>

#include "core/platform/TechnologyNames.h"
#include "service/sim/SimRandom.h"
#include "service/sim/SimulatedBaseband.h"
#include "service/sim/TechnologyEmitter.h"

namespace velmar {
namespace {

constexpr double kSimulatedSeconds = 120.0;

void simulate(benchmark::State& state, const std::string& technology) {
    std::uint64_t blobs = 0;
    std::uint64_t bytes = 0;
    for (auto _ : state) {
        sim::SimSettings settings;
        settings.technology = technology;
        settings.seed = 1;
        sim::SimulatedBaseband baseband(settings);
        baseband.runUntil(kSimulatedSeconds, [&](ByteView blob) {
            ++blobs;
            bytes += blob.size();
            benchmark::DoNotOptimize(blob.data());
        });
    }
    state.counters["blobs/s"] = benchmark::Counter(static_cast<double>(blobs), benchmark::Counter::kIsRate);
    state.counters["sim s per s"] = benchmark::Counter(
        kSimulatedSeconds * static_cast<double>(state.iterations()), benchmark::Counter::kIsRate);
    state.counters["blobs per sim s"] =
        static_cast<double>(blobs) / (kSimulatedSeconds * static_cast<double>(state.iterations()));
    state.SetBytesProcessed(static_cast<std::int64_t>(bytes));
}

// Registers a benchmark per technology whose simulator exists.
int registerSimulators() {
    int registered = 0;
    for (const TechnologyName& technology : kTechnologyNames) {
        sim::SimRandom probe(1);
        if (!sim::makeTechnologyEmitter(technology.name, probe)) {
            continue;
        }
        const std::string name(technology.name);
        benchmark::RegisterBenchmark(("Simulator/" + name).c_str(), [name](benchmark::State& state) {
            simulate(state, name);
        })->Unit(benchmark::kMillisecond);
        ++registered;
    }
    return registered;
}

const int kRegistered = registerSimulators();

}  // namespace
}  // namespace velmar

BENCHMARK_MAIN();
