// Decoding a recorded capture held in memory, against the floor of any decode: cutting the stream into
// frames and checking their CRCs. velmar-decode's own path (deframer, packet-version adapter, LTE generator
// without gathering raw blobs, one refresh at the end) should stay within a small factor of the floor.
#include <benchmark/benchmark.h>

#include <memory>
#include <string>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/ORVLogGenerator.h"
#include "bench/BenchFeeding.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/WholeFile.h"
#include "logfile/DiagFraming.h"
#include "logfile/DiagStreamDeframer.h"
#include "logfile/LogFormat.h"
#include "logfile/PacketVersionAdapter.h"

namespace velmar {
namespace {

const PlistData& captureBytes() {
    static const PlistData bytes = [] {
        PlistData read;
        readWholeFile(std::string(VELMAR_SOURCE_DIR) + "/samples/captures/mixed-large-1.qmdl", read);
        return read;
    }();
    return bytes;
}

class CountingSink : public DiagFrameSink {
  public:
    bool onDiagFrame(const DiagFrameView& frame) override {
        payloadBytes += frame.payload.size();
        return true;
    }
    std::size_t payloadBytes = 0;
};

// The floor: every frame unescaped and its CRC checked, nothing more.
void BM_DeframeAndCrc(benchmark::State& state) {
    bench::quietLog();
    const PlistData& bytes = captureBytes();
    for (auto _ : state) {
        CountingSink sink;
        DiagStreamDeframer deframer("capture", sink);
        deframer.feed(bytes);
        deframer.finish();
        benchmark::DoNotOptimize(sink.payloadBytes);
    }
    state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(bytes.size()));
}
BENCHMARK(BM_DeframeAndCrc)->Unit(benchmark::kMillisecond);

// The CRC alone over the whole capture.
void BM_Crc(benchmark::State& state) {
    const PlistData& bytes = captureBytes();
    for (auto _ : state) {
        benchmark::DoNotOptimize(crc16X25(bytes));
    }
    state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(bytes.size()));
}
BENCHMARK(BM_Crc)->Unit(benchmark::kMillisecond);

// What velmar-decode does with the capture: the reader, the adapter and the generator, one final refresh.
void BM_DecodeCaptureAsTheToolDoes(benchmark::State& state) {
    bench::quietLog();
    const PlistData& bytes = captureBytes();
    for (auto _ : state) {
        std::unique_ptr<LogGenerator> generator =
            LogGenerator::generatorFromTechnology(kKxLogChannelTechnology_Orvane_LTE);
        if (auto* binary = dynamic_cast<ORVLogGenerator*>(generator.get())) {
            binary->setGathersRawBlobs(false);
        }
        const StateDict stateDict = PlistDictionary::create();
        PacketVersionAdapter adapter;
        std::string error;
        forEachLogItemInBytes(
            bytes, "capture.qmdl", LogFormat::Auto,
            [&](const LogItemView& item) {
                generator->updateState(stateDict, adapter.adapt(item.bytes).blob);
                return true;
            },
            error);
        generator->generateLogUsingState(stateDict);
    }
    state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(bytes.size()));
}
BENCHMARK(BM_DecodeCaptureAsTheToolDoes)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace velmar

BENCHMARK_MAIN();
