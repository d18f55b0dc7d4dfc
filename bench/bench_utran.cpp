// The UTRAN generator on a realistic stream built with the UTRAN record builders: RRC state changes, the
// serving cell, UTRAN neighbour measurements (8 to 16 cells), GSM neighbour measurements (4 to 8 cells),
// transport-channel quality (2 to 6 transport channels, 1 to 3 composite channels) and the telephony
// service's cell-monitor array. Every blob goes through UTRANLogGenerator's updateState at the default log
// threshold, with a display refresh every 100 blobs. Reports records per second for the stream and the time
// per record of each code.
#include <benchmark/benchmark.h>

#include <random>
#include <string>
#include <vector>

#include "LogGenerator/UTRAN/UTRANLogGenerator.h"
#include "bench/BenchFeeding.h"
#include "core/platform/KxServerProtocol.h"
#include "logfile/records/UtranRecords.h"

namespace velmar {
namespace {

constexpr std::size_t kRefreshEvery = 100;

class StreamMaker {
  public:
    explicit StreamMaker(unsigned seed) : random_(seed) {}

    int between(int low, int high) { return std::uniform_int_distribution<int>(low, high)(random_); }

    PlistData rrcState() {
        UtranRrcStateRecord record;
        record.modeValid = 1;
        record.mode = static_cast<std::uint8_t>(between(0, 5));
        return buildUtranRrcStateRecord(record, timestamp());
    }

    PlistData servingCell() {
        UtranServingCellRecord record;
        record.cellAccessRestrictions = 0;
        record.uraId = static_cast<std::uint8_t>(between(0, 255));
        record.uplinkUarfcn = 9612;
        record.downlinkUarfcn = 10562;
        record.cellId = static_cast<std::uint32_t>(between(1, 65535));
        return buildUtranServingCellRecord(record, timestamp());
    }

    PlistData neighbours() {
        UtranNeighbourMeasurementRecord record;
        const int cells = between(8, 16);
        for (int k = 0; k < cells; ++k) {
            record.neighbours.push_back({static_cast<std::uint16_t>(between(10050, 10125)),
                                         static_cast<std::uint8_t>(between(0, 127)),
                                         static_cast<std::uint8_t>(between(0, 255)),
                                         static_cast<std::uint8_t>(between(0, 3)), between(0, 1) == 1});
        }
        return buildUtranNeighbourMeasurementRecord(record, timestamp());
    }

    PlistData gsmNeighbours() {
        UtranGsmNeighbourMeasurementRecord record;
        const int cells = between(4, 8);
        for (int k = 0; k < cells; ++k) {
            record.neighbours.push_back({static_cast<std::uint16_t>(between(0, 16383)), false, true,
                                         static_cast<std::uint8_t>(between(0, 7)),
                                         static_cast<std::uint8_t>(between(0, 7)),
                                         static_cast<std::uint16_t>(between(0, 1023)),
                                         static_cast<std::int16_t>(between(-110, -50))});
        }
        return buildUtranGsmNeighbourMeasurementRecord(record, timestamp());
    }

    PlistData channelQuality() {
        UtranChannelQualityRecord record;
        const int transport = between(2, 6);
        for (int k = 0; k < transport; ++k) {
            record.transportChannels.push_back(
                {static_cast<std::uint8_t>(k + 1), static_cast<std::uint8_t>(between(0, 100))});
        }
        const int composite = between(1, 3);
        for (int k = 0; k < composite; ++k) {
            UtranCompositeChannel channel;
            channel.id = static_cast<std::uint8_t>(k);
            channel.timeslot = static_cast<std::uint8_t>(between(0, 6));
            for (auto& sir : channel.sir) {
                sir = static_cast<std::uint8_t>(between(0, 60));
            }
            record.compositeChannels.push_back(channel);
        }
        return buildUtranChannelQualityRecord(record, timestamp());
    }

    PlistData cellMonitor() {
        UtranCellMonitorCell serving;
        serving.technology = std::string(kKxCellMonitorRadioAccessTechnologyUTRAN2);
        serving.cellType = std::string(kKxCellMonitorCellTypeServing);
        serving.locationAreaCode = 4321;
        serving.cellId = between(1, 65535);
        serving.bandInfo = 34;
        serving.scramblingCode = between(0, 127);
        serving.uarfcn = 10562;
        UtranCellMonitorCell neighbour = serving;
        neighbour.cellType = std::string(kKxCellMonitorCellTypeNeighbor);
        return buildUtranCellMonitorRecord({serving, neighbour, neighbour}, timestamp());
    }

  private:
    // 40 ms per record: 32 ticks of 1/800 s, counted in the timestamp's upper 48 bits.
    std::uint64_t timestamp() { return clock_ += std::uint64_t{32} << 16; }
    std::mt19937 random_;
    std::uint64_t clock_ = 0;
};

const std::vector<PlistData>& utranStream() {
    static const std::vector<PlistData> stream = [] {
        StreamMaker maker(20240602);
        std::vector<PlistData> out;
        for (int phase = 0; phase < 40; ++phase) {
            out.push_back(maker.rrcState());
            out.push_back(maker.servingCell());
            out.push_back(maker.cellMonitor());
            for (int cycle = 0; cycle < 100; ++cycle) {
                out.push_back(maker.neighbours());
                out.push_back(maker.channelQuality());
                if (cycle % 3 == 0) {
                    out.push_back(maker.gsmNeighbours());
                }
                if (cycle % 25 == 0) {
                    out.push_back(maker.cellMonitor());
                }
            }
        }
        return out;
    }();
    return stream;
}

void feed(benchmark::State& state, const std::vector<PlistData>& blobs) {
    auto generator = UTRANLogGenerator::generator();
    bench::feedCycle(state, *generator, blobs, kRefreshEvery);
}

void BM_UtranStream(benchmark::State& state) {
    state.counters["blobs"] = static_cast<double>(utranStream().size());
    feed(state, utranStream());
}
BENCHMARK(BM_UtranStream);

template <PlistData (StreamMaker::*Make)()>
void BM_UtranCode(benchmark::State& state) {
    StreamMaker maker(11);
    std::vector<PlistData> blobs;
    for (int k = 0; k < 64; ++k) {
        blobs.push_back((maker.*Make)());
    }
    feed(state, blobs);
}
BENCHMARK_TEMPLATE(BM_UtranCode, &StreamMaker::rrcState)->Name("BM_UtranCode/0xD0E0");
BENCHMARK_TEMPLATE(BM_UtranCode, &StreamMaker::servingCell)->Name("BM_UtranCode/0xD0E2");
BENCHMARK_TEMPLATE(BM_UtranCode, &StreamMaker::neighbours)->Name("BM_UtranCode/0xD00A");
BENCHMARK_TEMPLATE(BM_UtranCode, &StreamMaker::gsmNeighbours)->Name("BM_UtranCode/0xD00E");
BENCHMARK_TEMPLATE(BM_UtranCode, &StreamMaker::channelQuality)->Name("BM_UtranCode/0xD00C");
BENCHMARK_TEMPLATE(BM_UtranCode, &StreamMaker::cellMonitor)->Name("BM_UtranCode/0xFF0001");

}  // namespace
}  // namespace velmar

BENCHMARK_MAIN();
