// The LTE generator on a realistic idle-and-connected stream built with the LTE record builders: idle-mode
// serving and neighbour measurements at the DRX rate (8 to 16 neighbours), connected-mode intra-frequency
// measurements (4 to 8 neighbours), reselection candidates (6), serving-cell information, and the telephony
// service's extra records (cell-monitor array, PDP contexts, SIM files). Every blob goes through
// LTELogGenerator::updateState at the default log threshold, with a display refresh every 100 blobs.
// Reports records per second for the stream and the time per record of each code.
#include <benchmark/benchmark.h>

#include <random>
#include <string>
#include <vector>

#include "LogGenerator/LTE/LTELogGenerator.h"
#include "bench/BenchFeeding.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/plist/PlistCodec.h"
#include "logfile/records/LteRecords.h"
#include "logfile/records/RecordBuilder.h"

namespace velmar {
namespace {

constexpr std::size_t kRefreshEvery = 100;

class StreamMaker {
  public:
    explicit StreamMaker(unsigned seed) : random_(seed) {}

    int between(int low, int high) { return std::uniform_int_distribution<int>(low, high)(random_); }

    PlistData servingMeasurement() {
        LteIdleServingMeasurementRecord record;
        record.version = 4;
        record.earfcn = 6300;
        record.physicalCellId = 301;
        record.servingLayerPriority = 5;
        record.measuredRsrp = static_cast<std::uint16_t>(between(120, 260));
        record.averageRsrp = static_cast<std::uint16_t>(between(120, 260));
        record.measuredRsrq = static_cast<std::uint8_t>(between(40, 100));
        record.averageRsrq = static_cast<std::uint8_t>(between(40, 100));
        record.measuredRssi = static_cast<std::uint16_t>(between(60, 140));
        record.qrxlevmin = 31;
        record.pMax = static_cast<std::uint8_t>(between(0, 1) ? 64 : 53);
        record.maxUeTxPower = 53;
        record.srxlev = static_cast<std::uint8_t>(between(30, 90));
        record.sIntraSearch = 31;
        record.sNonIntraSearch = 32;
        return buildLteIdleServingMeasurementRecord(record, timestamp());
    }

    PlistData neighbourMeasurement() {
        LteIdleNeighbourMeasurementRecord record;
        record.version = 4;
        record.earfcn = 6300;
        record.qrxlevmin = 31;
        const int cells = between(8, 16);
        for (int k = 0; k < cells; ++k) {
            record.neighbours.push_back(
                {static_cast<std::uint16_t>(between(0, 503)), static_cast<std::uint8_t>(between(60, 140)),
                 static_cast<std::uint16_t>(between(80, 200)), static_cast<std::uint16_t>(between(80, 200)),
                 static_cast<std::uint8_t>(between(20, 100)), static_cast<std::uint8_t>(between(20, 100)),
                 static_cast<std::uint8_t>(between(10, 80)), static_cast<std::uint16_t>(between(0, 400)),
                 static_cast<std::uint16_t>(between(0, 2047)),
                 static_cast<std::uint32_t>(between(0, 300000))});
        }
        return buildLteIdleNeighbourMeasurementRecord(record, timestamp());
    }

    PlistData intraFrequency() {
        LteIntraFrequencyRecord record;
        record.version = 1;
        record.earfcn = 1850;
        record.servingPhysicalCellId = 301;
        record.subframeNumber = static_cast<std::uint16_t>(between(0, 10239));
        record.servingFilteredRsrp = static_cast<std::uint16_t>(between(160, 300));
        record.servingFilteredRsrq = static_cast<std::uint16_t>(between(40, 150));
        const int measured = between(4, 8);
        for (int k = 0; k < measured; ++k) {
            record.measured.push_back({static_cast<std::uint16_t>(between(0, 503)),
                                       static_cast<std::uint16_t>(between(100, 260)),
                                       static_cast<std::uint16_t>(between(20, 150))});
        }
        const int detected = between(0, 2);
        for (int k = 0; k < detected; ++k) {
            record.detected.push_back(static_cast<std::uint16_t>(between(0, 503)));
        }
        return buildLteIntraFrequencyRecord(record, timestamp());
    }

    PlistData reselection() {
        LteReselectionCandidatesRecord record;
        record.version = 2;
        record.servingEarfcn = 6300;
        record.servingCellId = 301;
        for (int k = 0; k < 6; ++k) {
            record.candidates.push_back(
                {static_cast<std::uint16_t>(between(0, 7)), static_cast<std::uint16_t>(between(0, 4)),
                 static_cast<std::uint16_t>(between(0, 20000)), static_cast<std::uint16_t>(between(0, 503)),
                 static_cast<std::uint8_t>(between(0, 20)), static_cast<std::uint8_t>(between(0, 63))});
        }
        return buildLteReselectionCandidatesRecord(record, timestamp());
    }

    PlistData servingCellInfo() {
        LteServingCellInfoRecord record;
        record.physicalCellId = static_cast<std::uint16_t>(between(0, 503));
        record.downlinkEarfcn = 6300;
        record.uplinkEarfcn = 24300;
        record.downlinkBandwidth = 100;
        record.uplinkBandwidth = 100;
        record.cellIdentity = static_cast<std::uint32_t>(between(1, 268435455));
        record.trackingAreaCode = 12345;
        record.frequencyBandIndicator = 20;
        return buildLteServingCellInfoRecord(record, timestamp());
    }

    PlistData masterInformation() {
        LteMasterInformationRecord record;
        record.numTxAntennas = 2;
        return buildLteMasterInformationRecord(record, timestamp());
    }

    PlistData cellMonitor() {
        LteCellMonitorCell serving;
        serving.technology = std::string(kKxCellMonitorRadioAccessTechnologyLTE);
        serving.cellType = std::string(kKxCellMonitorCellTypeServing);
        serving.trackingAreaCode = 12345;
        serving.cellId = between(1, 268435455);
        serving.physicalCellId = 301;
        serving.bandInfo = 20;
        serving.uarfcn = 6300;
        LteCellMonitorCell neighbour = serving;
        neighbour.cellType = std::string(kKxCellMonitorCellTypeNeighbor);
        return buildLteCellMonitorRecord({neighbour, serving, neighbour}, timestamp());
    }

    PlistData pdpContexts() {
        auto context = PlistDictionary::create();
        context->set("Context ID", "1");
        context->set("APN", "internet");
        context->set("PDP Type", "IPV4V6");
        auto contexts = PlistArray::create();
        contexts->append(PlistValue(context));
        return buildExtendedPacket(0x0002, *serializeBinary(PlistValue(contexts)), timestamp());
    }

    PlistData simFiles() {
        auto files = PlistDictionary::create();
        files->set("kSimFile_ICCID", "8944110068256270054");
        files->set("kSimFile_AD", "00000002");
        return buildExtendedPacket(0x0000, *serializeBinary(PlistValue(files)), timestamp());
    }

  private:
    // 40 ms per record: 32 ticks of 1/800 s, counted in the timestamp's upper 48 bits.
    std::uint64_t timestamp() { return clock_ += std::uint64_t{32} << 16; }
    std::mt19937 random_;
    std::uint64_t clock_ = 0;
};

// Idle phases (one DRX cycle: serving and neighbour measurements, a reselection record every few cycles)
// alternate with connected phases (intra-frequency measurements), with cell changes and extra records
// between.
const std::vector<PlistData>& lteStream() {
    static const std::vector<PlistData> stream = [] {
        StreamMaker maker(20240601);
        std::vector<PlistData> out;
        for (int phase = 0; phase < 40; ++phase) {
            out.push_back(maker.servingCellInfo());
            out.push_back(maker.masterInformation());
            out.push_back(maker.cellMonitor());
            for (int cycle = 0; cycle < 60; ++cycle) {
                out.push_back(maker.servingMeasurement());
                out.push_back(maker.neighbourMeasurement());
                if (cycle % 4 == 0) {
                    out.push_back(maker.reselection());
                }
                if (cycle % 20 == 0) {
                    out.push_back(maker.cellMonitor());
                }
            }
            out.push_back(maker.pdpContexts());
            for (int report = 0; report < 150; ++report) {
                out.push_back(maker.intraFrequency());
                if (report % 50 == 0) {
                    out.push_back(maker.cellMonitor());
                }
            }
            if (phase % 10 == 0) {
                out.push_back(maker.simFiles());
            }
        }
        return out;
    }();
    return stream;
}

void feed(benchmark::State& state, const std::vector<PlistData>& blobs) {
    LTELogGenerator generator;
    bench::feedCycle(state, generator, blobs, kRefreshEvery);
}

void BM_LteStream(benchmark::State& state) {
    state.counters["blobs"] = static_cast<double>(lteStream().size());
    feed(state, lteStream());
}
BENCHMARK(BM_LteStream);

// One code at a time: 64 different records of the code, cycled.
template <PlistData (StreamMaker::*Make)()>
void BM_LteCode(benchmark::State& state) {
    StreamMaker maker(7);
    std::vector<PlistData> blobs;
    for (int k = 0; k < 64; ++k) {
        blobs.push_back((maker.*Make)());
    }
    feed(state, blobs);
}
BENCHMARK_TEMPLATE(BM_LteCode, &StreamMaker::servingCellInfo)->Name("BM_LteCode/0xB0C2");
BENCHMARK_TEMPLATE(BM_LteCode, &StreamMaker::masterInformation)->Name("BM_LteCode/0xB0C1");
BENCHMARK_TEMPLATE(BM_LteCode, &StreamMaker::intraFrequency)->Name("BM_LteCode/0xB179");
BENCHMARK_TEMPLATE(BM_LteCode, &StreamMaker::servingMeasurement)->Name("BM_LteCode/0xB17F");
BENCHMARK_TEMPLATE(BM_LteCode, &StreamMaker::neighbourMeasurement)->Name("BM_LteCode/0xB180");
BENCHMARK_TEMPLATE(BM_LteCode, &StreamMaker::reselection)->Name("BM_LteCode/0xB186");
BENCHMARK_TEMPLATE(BM_LteCode, &StreamMaker::cellMonitor)->Name("BM_LteCode/0xFF0001");
BENCHMARK_TEMPLATE(BM_LteCode, &StreamMaker::pdpContexts)->Name("BM_LteCode/0xFF0002");
BENCHMARK_TEMPLATE(BM_LteCode, &StreamMaker::simFiles)->Name("BM_LteCode/0xFF0000");

}  // namespace
}  // namespace velmar

BENCHMARK_MAIN();
