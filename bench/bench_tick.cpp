// The cost of one display tick of the monitor on a realistic state: the generator's refresh of the display
// from the state, then the display tree the panes read, and the sampling of its numeric leaves into the
// value history (alone, and as part of the tick). The state is what a real capture leaves behind after every
// one of its packets went through the generator.
#include <benchmark/benchmark.h>

#include <memory>
#include <string>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "bench/BenchFeeding.h"
#include "core/ArrayLock.h"
#include "core/ValueHistory.h"
#include "core/VelmarModelNode.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/SystemLog.h"
#include "logfile/LogFormat.h"

namespace velmar {
namespace {

struct DecodedCapture {
    std::unique_ptr<LogGenerator> generator;
    StateDict state;
};

DecodedCapture decodeCapture(const std::string& name, std::string_view technology) {
    bench::quietLog();
    DecodedCapture decoded{LogGenerator::generatorFromTechnology(technology), PlistDictionary::create()};
    std::string error;
    forEachLogItem(
        std::string(VELMAR_SOURCE_DIR) + "/samples/captures/" + name, LogFormat::Auto,
        [&](const LogItemView& item) {
            if (!item.isTick()) {
                decoded.generator->updateState(decoded.state, item.bytes);
            }
            return true;
        },
        error);
    return decoded;
}

void tick(benchmark::State& state, const char* capture, std::string_view technology, bool withHistory) {
    DecodedCapture decoded = decodeCapture(capture, technology);
    ValueHistory history;
    double time = 0.0;
    std::size_t nodes = 0;
    for (auto _ : state) {
        decoded.generator->generateLogUsingState(decoded.state);
        NodePathDictionary paths;
        auto root = VelmarModelNode::makeTreeFromObject(decoded.state->get(state_keys::kDisplay), paths);
        if (withHistory) {
            history.sample(paths, time += ValueHistory::Limits{}.intervalSeconds);
        }
        benchmark::DoNotOptimize(root);
        nodes = paths.size();
    }
    state.counters["nodes"] = static_cast<double>(nodes);
    state.counters["series"] = static_cast<double>(history.seriesCount());
    ArrayLock::releaseOutstandingForTesting();
}

// Sampling alone, on the tree of the decoded capture; past the first hour of ticks every ring is full and
// each sample overwrites the oldest.
void sampling(benchmark::State& state, const char* capture, std::string_view technology) {
    DecodedCapture decoded = decodeCapture(capture, technology);
    decoded.generator->generateLogUsingState(decoded.state);
    NodePathDictionary paths;
    auto root = VelmarModelNode::makeTreeFromObject(decoded.state->get(state_keys::kDisplay), paths);
    ValueHistory history;
    double time = 0.0;
    for (auto _ : state) {
        history.sample(paths, time += ValueHistory::Limits{}.intervalSeconds);
    }
    state.counters["series"] = static_cast<double>(history.seriesCount());
    state.counters["history_bytes"] = static_cast<double>(history.bytes());
    ArrayLock::releaseOutstandingForTesting();
}

void BM_TickLteConnected(benchmark::State& state) {
    tick(state, "lte-connected-1.qmdl", kKxLogChannelTechnology_Orvane_LTE, false);
}
BENCHMARK(BM_TickLteConnected)->Unit(benchmark::kMicrosecond);

void BM_TickLteConnectedWithHistory(benchmark::State& state) {
    tick(state, "lte-connected-1.qmdl", kKxLogChannelTechnology_Orvane_LTE, true);
}
BENCHMARK(BM_TickLteConnectedWithHistory)->Unit(benchmark::kMicrosecond);

void BM_HistorySampleLteConnected(benchmark::State& state) {
    sampling(state, "lte-connected-1.qmdl", kKxLogChannelTechnology_Orvane_LTE);
}
BENCHMARK(BM_HistorySampleLteConnected)->Unit(benchmark::kMicrosecond);

void BM_TickGsmMixedLarge(benchmark::State& state) {
    tick(state, "mixed-large-1.qmdl", kKxLogChannelTechnology_Orvane_GSM, false);
}
BENCHMARK(BM_TickGsmMixedLarge)->Unit(benchmark::kMicrosecond);

void BM_TickGsmMixedLargeWithHistory(benchmark::State& state) {
    tick(state, "mixed-large-1.qmdl", kKxLogChannelTechnology_Orvane_GSM, true);
}
BENCHMARK(BM_TickGsmMixedLargeWithHistory)->Unit(benchmark::kMicrosecond);

void BM_HistorySampleGsmMixedLarge(benchmark::State& state) {
    sampling(state, "mixed-large-1.qmdl", kKxLogChannelTechnology_Orvane_GSM);
}
BENCHMARK(BM_HistorySampleGsmMixedLarge)->Unit(benchmark::kMicrosecond);

}  // namespace
}  // namespace velmar

BENCHMARK_MAIN();
