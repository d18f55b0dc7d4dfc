// The cost of one display tick of the monitor on a realistic state: the generator's refresh of the display
// from the state, then the display tree the panes read. The state is what a real LTE capture leaves
// behind after every one of its packets went through the LTE generator.
#include <benchmark/benchmark.h>

#include <memory>
#include <string>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/StateKeys.h"
#include "bench/BenchFeeding.h"
#include "core/ArrayLock.h"
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

void tick(benchmark::State& state, const char* capture, std::string_view technology) {
    DecodedCapture decoded = decodeCapture(capture, technology);
    std::size_t nodes = 0;
    for (auto _ : state) {
        decoded.generator->generateLogUsingState(decoded.state);
        NodePathDictionary paths;
        auto root = VelmarModelNode::makeTreeFromObject(decoded.state->get(state_keys::kDisplay), paths);
        benchmark::DoNotOptimize(root);
        nodes = paths.size();
    }
    state.counters["nodes"] = static_cast<double>(nodes);
    ArrayLock::releaseOutstandingForTesting();
}

void BM_TickLteConnected(benchmark::State& state) {
    tick(state, "lte-connected-1.qmdl", kKxLogChannelTechnology_Orvane_LTE);
}
BENCHMARK(BM_TickLteConnected)->Unit(benchmark::kMicrosecond);

void BM_TickGsmMixedLarge(benchmark::State& state) {
    tick(state, "mixed-large-1.qmdl", kKxLogChannelTechnology_Orvane_GSM);
}
BENCHMARK(BM_TickGsmMixedLarge)->Unit(benchmark::kMicrosecond);

}  // namespace
}  // namespace velmar

BENCHMARK_MAIN();
