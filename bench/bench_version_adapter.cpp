// The packet-version adapter's cost on the mixed-large-1 capture (47,087 blobs, 1,493 of them in newer
// versions): decoding the file as velmar-decode does (read, deframe, decode) and decoding its blobs from
// memory, with the LTE and the GSM/UMTS generators, as recorded and through the adapter; and the adapter
// alone, per blob and per rewrite.
#include <benchmark/benchmark.h>

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "LogGenerator/LogGenerator.h"
#include "bench/BenchFeeding.h"
#include "core/platform/KxServerProtocol.h"
#include "logfile/LogFormat.h"
#include "logfile/PacketVersionAdapter.h"

namespace velmar {
namespace {

const std::vector<PlistData>& captureBlobs() {
    return bench::mixedCaptureBlobs();
}

// One pass over the capture per iteration, refreshing the display every 1,000 blobs.
void decodeCapture(benchmark::State& state, std::string_view technology, bool adapt) {
    bench::quietLog();
    std::unique_ptr<LogGenerator> generator = LogGenerator::generatorFromTechnology(technology);
    const StateDict stateDict = PlistDictionary::create();
    const auto& blobs = captureBlobs();
    PacketVersionAdapter adapter;
    for (auto _ : state) {
        std::size_t sinceRefresh = 0;
        for (const PlistData& blob : blobs) {
            generator->updateState(stateDict, adapt ? adapter.adapt(blob).blob : ByteView(blob));
            if (++sinceRefresh == 1000) {
                sinceRefresh = 0;
                generator->generateLogUsingState(stateDict);
            }
        }
    }
    state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(blobs.size()));
}

void BM_DecodeCapture_Lte_AsRecorded(benchmark::State& state) {
    decodeCapture(state, kKxLogChannelTechnology_Orvane_LTE, false);
}
void BM_DecodeCapture_Lte_Adapted(benchmark::State& state) {
    decodeCapture(state, kKxLogChannelTechnology_Orvane_LTE, true);
}
void BM_DecodeCapture_Gsm_AsRecorded(benchmark::State& state) {
    decodeCapture(state, kKxLogChannelTechnology_Orvane_GSM, false);
}
void BM_DecodeCapture_Gsm_Adapted(benchmark::State& state) {
    decodeCapture(state, kKxLogChannelTechnology_Orvane_GSM, true);
}
BENCHMARK(BM_DecodeCapture_Lte_AsRecorded)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_DecodeCapture_Lte_Adapted)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_DecodeCapture_Gsm_AsRecorded)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_DecodeCapture_Gsm_Adapted)->Unit(benchmark::kMillisecond);

// What velmar-decode does with the file: read and deframe the capture, and decode every blob (one pass per
// iteration, a display refresh every 1,000 blobs).
void decodeFile(benchmark::State& state, std::string_view technology, bool adapt) {
    bench::quietLog();
    std::unique_ptr<LogGenerator> generator = LogGenerator::generatorFromTechnology(technology);
    const StateDict stateDict = PlistDictionary::create();
    const std::string path = std::string(VELMAR_SOURCE_DIR) + "/samples/captures/mixed-large-1.qmdl";
    PacketVersionAdapter adapter;
    std::int64_t blobs = 0;
    for (auto _ : state) {
        std::size_t sinceRefresh = 0;
        std::string error;
        forEachLogItem(
            path, LogFormat::DiagCapture,
            [&](const LogItemView& item) {
                if (item.isBlob()) {
                    generator->updateState(stateDict, adapt ? adapter.adapt(item.bytes).blob : item.bytes);
                    ++blobs;
                    if (++sinceRefresh == 1000) {
                        sinceRefresh = 0;
                        generator->generateLogUsingState(stateDict);
                    }
                }
                return true;
            },
            error);
        generator->generateLogUsingState(stateDict);
    }
    state.SetItemsProcessed(blobs);
}

void BM_DecodeFile_Lte_AsRecorded(benchmark::State& state) {
    decodeFile(state, kKxLogChannelTechnology_Orvane_LTE, false);
}
void BM_DecodeFile_Lte_Adapted(benchmark::State& state) {
    decodeFile(state, kKxLogChannelTechnology_Orvane_LTE, true);
}
void BM_DecodeFile_Gsm_AsRecorded(benchmark::State& state) {
    decodeFile(state, kKxLogChannelTechnology_Orvane_GSM, false);
}
void BM_DecodeFile_Gsm_Adapted(benchmark::State& state) {
    decodeFile(state, kKxLogChannelTechnology_Orvane_GSM, true);
}
BENCHMARK(BM_DecodeFile_Lte_AsRecorded)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_DecodeFile_Lte_Adapted)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_DecodeFile_Gsm_AsRecorded)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_DecodeFile_Gsm_Adapted)->Unit(benchmark::kMillisecond);

// The adapter alone, one blob per iteration, round and round the capture.
void BM_AdapterPerBlob(benchmark::State& state) {
    const auto& blobs = captureBlobs();
    PacketVersionAdapter adapter;
    std::size_t next = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(adapter.adapt(blobs[next]).blob.data());
        next = next + 1 == blobs.size() ? 0 : next + 1;
    }
    state.SetItemsProcessed(state.iterations());
}
BENCHMARK(BM_AdapterPerBlob);

// The adapter on the capture's records of newer versions only: the cost of one rewrite.
void BM_AdapterPerRewrite(benchmark::State& state) {
    std::vector<PlistData> newer;
    PacketVersionAdapter adapter;
    for (const PlistData& blob : captureBlobs()) {
        if (adapter.adapt(blob).outcome == VersionOutcome::Adapted) {
            newer.push_back(blob);
        }
    }
    std::size_t next = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(adapter.adapt(newer[next]).blob.data());
        next = next + 1 == newer.size() ? 0 : next + 1;
    }
    state.SetItemsProcessed(state.iterations());
    state.counters["records"] = static_cast<double>(newer.size());
}
BENCHMARK(BM_AdapterPerRewrite);

}  // namespace
}  // namespace velmar

BENCHMARK_MAIN();
