// Decoding a recorded capture held in memory, against the floor of any decode: cutting the stream into
// frames and checking their CRCs. velmar-decode's own path (deframer, code filter, packet-version adapter,
// LTE generator without gathering raw blobs, one refresh at the end) should stay within a small factor of
// the floor.
#include <benchmark/benchmark.h>

#include <memory>
#include <optional>
#include <string>

#include "LogGenerator/LogGenerator.h"
#include "LogGenerator/ORVLogGenerator.h"
#include "LogGenerator/SubscribedCodes.h"
#include "bench/BenchFeeding.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/WholeFile.h"
#include "logfile/DiagFraming.h"
#include "logfile/DiagStreamDeframer.h"
#include "logfile/LogFormat.h"
#include "logfile/PacketVersionAdapter.h"

namespace velmar {
namespace {

// The capture repeated into a stream of about 22 MB (it ends on a frame's 0x7E, so the copies join
// cleanly): long enough that the generator's one-time set-up weighs as little as on a real drive log.
const PlistData& captureBytes() {
    static const PlistData bytes = [] {
        PlistData read;
        readWholeFile(std::string(VELMAR_SOURCE_DIR) + "/samples/captures/mixed-large-1.qmdl", read);
        PlistData stream;
        for (int copy = 0; copy < 8; ++copy) {
            stream.insert(stream.end(), read.begin(), read.end());
        }
        return stream;
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

// Decodes the capture with the tool's generator set-up: the reader, the adapter and the generator, one
// final refresh. With every packet, each one goes through the adapter to the generator; as the tool does,
// packets of codes that no decoder reads are left out first.
void decodeCapture(benchmark::State& state, bool everyPacket) {
    bench::quietLog();
    const PlistData& bytes = captureBytes();
    for (auto _ : state) {
        std::unique_ptr<LogGenerator> generator =
            LogGenerator::generatorFromTechnology(kKxLogChannelTechnology_Orvane_LTE);
        if (auto* binary = dynamic_cast<ORVLogGenerator*>(generator.get())) {
            binary->setGathersRawBlobs(false);
        }
        const std::optional<SubscribedCodes> subscribed =
            everyPacket ? std::nullopt : SubscribedCodes::of(*generator);
        const StateDict stateDict = PlistDictionary::create();
        PacketVersionAdapter adapter;
        std::string error;
        bool generatorHasSeenAPacket = false;
        forEachLogItemInBytes(
            bytes, "capture.qmdl", LogFormat::Auto,
            [&](const LogItemView& item) {
                if (!subscribed || !generatorHasSeenAPacket || subscribed->passes(item.bytes)) {
                    generatorHasSeenAPacket = true;
                    generator->updateState(stateDict, adapter.adapt(item.bytes).blob);
                }
                return true;
            },
            error);
        generator->generateLogUsingState(stateDict);
    }
    state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(bytes.size()));
}

void BM_DecodeCaptureEveryPacket(benchmark::State& state) {
    decodeCapture(state, true);
}
BENCHMARK(BM_DecodeCaptureEveryPacket)->Unit(benchmark::kMillisecond);

void BM_DecodeCaptureAsTheToolDoes(benchmark::State& state) {
    decodeCapture(state, false);
}
BENCHMARK(BM_DecodeCaptureAsTheToolDoes)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace velmar

BENCHMARK_MAIN();
