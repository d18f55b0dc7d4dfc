// Intake and dispatch of a real blob stream (a recorded LTE capture) through a class index with one trivial
// decoder, and the display tree built from a 2,000-node display dictionary.
#include <benchmark/benchmark.h>

#include <string>
#include <vector>

#include "LogGenerator/ClassIndex.h"
#include "LogGenerator/ORVLogGenerator2.h"
#include "bench/BenchFeeding.h"
#include "core/ArrayLock.h"
#include "core/VelmarModelNode.h"
#include "core/platform/SystemLog.h"

namespace velmar {
namespace {

class CountingDecoder : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t) override { bytesSeen += data.size(); }
    std::string_view getSectionName() const override { return "Counter"; }
    LogCodeArray getLogCodeArray() const override {
        return std::vector<std::int32_t>{0xB0C2, 0xB179, 0x7130};
    }
    std::size_t bytesSeen = 0;
};

class CountingIndex : public ClassIndex {
  public:
    CountingIndex() { decoder = Base::initWithDict<CountingDecoder>(classDict, codeDictionary); }
    std::shared_ptr<CountingDecoder> decoder;
};

class BenchGenerator : public ORVLogGenerator2 {
  public:
    BenchGenerator() : ORVLogGenerator2("NoTemplate", std::make_shared<CountingIndex>()) {}
};

const std::vector<PlistData>& captureBlobs() {
    return bench::mixedCaptureBlobs();
}

// Framing and dispatch alone: what runs per packet before any decoder.
void BM_FramingAndDispatch(benchmark::State& state) {
    bench::quietLog();
    BenchGenerator generator;
    const auto& blobs = captureBlobs();
    std::size_t next = 0;
    for (auto _ : state) {
        generator.updateWithData(blobs[next]);
        next = next + 1 == blobs.size() ? 0 : next + 1;
    }
    state.SetItemsProcessed(state.iterations());
}
BENCHMARK(BM_FramingAndDispatch);

// The whole intake of one blob as the model calls it (display lookup, dispatch, raw-data append), with a
// display refresh every 1,000 blobs so the raw buffer stays the size of a real two-second interval.
void BM_UpdateState(benchmark::State& state) {
    bench::quietLog();
    BenchGenerator generator;
    const StateDict stateDict = PlistDictionary::create();
    const auto& blobs = captureBlobs();
    std::size_t next = 0;
    std::size_t sinceRefresh = 0;
    for (auto _ : state) {
        generator.updateState(stateDict, blobs[next]);
        next = next + 1 == blobs.size() ? 0 : next + 1;
        if (++sinceRefresh == 1000) {
            sinceRefresh = 0;
            generator.generateLogUsingState(stateDict);
        }
    }
    state.SetItemsProcessed(state.iterations());
}
BENCHMARK(BM_UpdateState);

PlistValue displayOfNodes(int sections, int rowsPerSection, int keysPerRow) {
    auto display = PlistDictionary::create();
    for (int s = 0; s < sections; ++s) {
        auto list = PlistArray::create();
        for (int r = 0; r < rowsPerSection; ++r) {
            auto row = PlistDictionary::create();
            for (int k = 0; k < keysPerRow; ++k) {
                row->set("Key " + std::to_string(k), std::to_string(-60 - k) + " dBm");
            }
            list->append(row);
        }
        display->set("Section " + std::to_string(s), list);
    }
    return display;
}

// A 2,000-node display: 20 sections × 12 rows × 7 keys = 20 + 240 + 1,680 nodes, plus the root.
void BM_DisplayTree2000Nodes(benchmark::State& state) {
    const PlistValue display = displayOfNodes(20, 12, 7);
    for (auto _ : state) {
        NodePathDictionary paths;
        auto root = VelmarModelNode::makeTreeFromObject(display, paths);
        benchmark::DoNotOptimize(root);
        state.counters["nodes"] = static_cast<double>(paths.size());
    }
    ArrayLock::releaseOutstandingForTesting();
}
BENCHMARK(BM_DisplayTree2000Nodes)->Unit(benchmark::kMicrosecond);

}  // namespace
}  // namespace velmar

BENCHMARK_MAIN();
