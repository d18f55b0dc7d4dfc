// The GSM/UMTS generator on a realistic mixed stream built with the record builders: GSM idle cycles
// (serving and neighbour measurements with 6 to 12 neighbours, BSIC lists, serving identity, RR state, GPRS
// cell options), a GSM dedicated phase (dedicated channel, mobile allocation, DTX), UMTS idle cycles (idle
// measurements of UMTS and GSM cells), UMTS connected phases (cell sets of 3 to 6 cells, HSDPA, BLER, uplink
// power, RRC state), the mobility-management and PLMN records at their own slower rates, and the telephony
// service's extra records (cell-monitor array, PDP contexts, SIM files). Every blob goes through
// ORV_GSMLogGenerator::updateState at the default log threshold, with a display refresh every 100 blobs.
// Reports records per second for the stream and the time per record of each code.
#include <benchmark/benchmark.h>

#include <random>
#include <string>
#include <vector>

#include "LogGenerator/GSM/ORV_GSMLogGenerator.h"
#include "bench/BenchFeeding.h"
#include "core/platform/KxServerProtocol.h"
#include "logfile/records/GsmRecords.h"
#include "logfile/records/GsmStateRecords.h"
#include "logfile/records/RecordBuilder.h"

namespace velmar {
namespace {

constexpr std::size_t kRefreshEvery = 100;

const std::string kGsm(kKxCellMonitorRadioAccessTechnologyGSM);
const std::string kUmts(kKxCellMonitorRadioAccessTechnologyUMTS);
const std::string kServing(kKxCellMonitorCellTypeServing);
const std::string kNeighbor(kKxCellMonitorCellTypeNeighbor);

class StreamMaker {
  public:
    explicit StreamMaker(unsigned seed) : random_(seed) {}

    int between(int low, int high) { return std::uniform_int_distribution<int>(low, high)(random_); }
    template <typename T>
    T pick(int low, int high) {
        return static_cast<T>(between(low, high));
    }

    // GSM cells.
    PlistData gsmMeasurements() {
        GsmMeasurementRecord record;
        record.rxLevel = pick<std::uint8_t>(10, 63);
        record.c1 = pick<std::uint32_t>(0, 60);
        record.c2 = pick<std::uint32_t>(0, 70);
        record.reselectHysteresis = pick<std::uint8_t>(0, 7);
        const int neighbours = between(6, 12);
        for (int k = 0; k < neighbours; ++k) {
            record.neighbours.push_back(
                {kArfcns[static_cast<std::size_t>(k)], pick<std::uint8_t>(5, 60), between(-20, 60)});
        }
        return buildGsmMeasurementRecord(record, timestamp());
    }
    PlistData bsicList() {
        GsmBsicListRecord record;
        for (const std::uint16_t arfcn : kArfcns) {
            record.entries.push_back({arfcn, pick<std::uint8_t>(0, 63)});
        }
        return buildGsmBsicListRecord(record, timestamp());
    }
    PlistData servingIdentity() {
        return buildGsmServingIdentityRecord(
            {kArfcns[0], pick<std::uint16_t>(0, 63), pick<std::uint16_t>(1, 65535), 0}, timestamp());
    }
    PlistData dedicatedChannel() {
        return buildGsmDedicatedChannelRecord({pick<std::uint16_t>(1, 124), 0}, timestamp());
    }
    PlistData mobileAllocation() {
        MobileAllocationRecord record;
        record.hsn = pick<std::uint8_t>(0, 63);
        for (int k = 0; k < 8; ++k) {
            record.arfcns.push_back(kArfcns[static_cast<std::size_t>(k)]);
        }
        return buildMobileAllocationRecord(record, timestamp());
    }

    // UMTS cells.
    PlistData umtsIdleCells() {
        UmtsSetRecord record;
        const int cells = between(3, 8);
        for (int k = 0; k < cells; ++k) {
            record.cells.push_back({10737, pick<std::uint16_t>(0, 511), pick<std::int8_t>(-100, -30),
                                    pick<std::int16_t>(-115, -50), pick<std::int8_t>(-48, 0),
                                    pick<std::int16_t>(-50, 50)});
        }
        return buildUmtsSetRecord(record, timestamp());
    }
    PlistData gsmIdleCells() {
        GsmSetRecord record;
        const int cells = between(2, 6);
        for (int k = 0; k < cells; ++k) {
            record.cells.push_back({kArfcns[static_cast<std::size_t>(k)], pick<std::uint16_t>(0, 63),
                                    pick<std::int8_t>(-110, -50), pick<std::int16_t>(-50, 50)});
        }
        return buildGsmSetRecord(record, timestamp());
    }
    PlistData cellSets() {
        UmtsCellSetRecord record;
        record.powerReading = pick<std::int16_t>(-1100, -400);
        const int cells = between(3, 6);
        for (int k = 0; k < cells; ++k) {
            record.cells.push_back({pick<std::uint16_t>(0, 511),
                                    pick<std::uint8_t>(0, 2),
                                    {pick<std::uint32_t>(0, 1) == 0 ? 0u : pick<std::uint32_t>(1000, 500000),
                                     pick<std::uint32_t>(1000, 500000), pick<std::uint32_t>(1000, 500000)}});
        }
        return buildUmtsCellSetRecord(record, timestamp());
    }
    PlistData hsdpa() {
        HsdpaRecord record;
        record.version = 1;
        record.subFrames = pick<std::uint16_t>(100, 1023);
        record.carrier = pick<std::uint8_t>(0, 2);
        for (int k = 0; k < 6; ++k) {
            record.primary.push_back({static_cast<std::uint8_t>(k), pick<std::uint32_t>(0, 4000000),
                                      pick<std::uint16_t>(0, 500), pick<std::uint16_t>(0, 50)});
        }
        return buildHsdpaRecord(record, timestamp());
    }
    PlistData blockErrors() {
        BlockErrorRecord record;
        record.windowSize = 100;
        for (int k = 0; k < 4; ++k) {
            record.channels.push_back(
                {static_cast<std::uint8_t>(k + 1), pick<std::uint32_t>(50, 100), pick<std::uint32_t>(0, 5)});
        }
        return buildBlockErrorRecord(record, timestamp());
    }
    PlistData uplinkPower() {
        UplinkPowerRecord record;
        for (int k = 0; k < 4; ++k) {
            record.readings.push_back(pick<std::int16_t>(-700, 200));
        }
        return buildUplinkPowerRecord(record, timestamp());
    }
    PlistData rrcState() { return buildRrcStateRecord({pick<std::uint8_t>(0, 5), 0}, timestamp()); }
    PlistData umtsCellIdentity() {
        return buildUmtsCellIdentityRecord({9787, 10737, pick<std::uint32_t>(1, 268435455), 7, 0},
                                           timestamp());
    }
    PlistData ciphering() { return buildCipheringRecord({1, 0}, timestamp()); }

    // Radio resource, GPRS, mobility and PLMN state.
    PlistData gsmRrState() {
        return buildGsmRrStateRecord({pick<std::uint8_t>(0, 21), 0, 0, 0, 0}, timestamp());
    }
    PlistData channelParameters() { return buildGsmChannelParametersRecord({1, 0}, timestamp()); }
    PlistData si13Position() { return buildSi13PositionRecord({0, 0}, timestamp()); }
    PlistData gprsCellOptions() { return buildGprsCellOptionsRecord({1, 6, 0, 0}, timestamp()); }
    PlistData tbfParameters() { return buildGprsTbfParametersRecord({3, 4, 1, 0}, timestamp()); }
    PlistData pbcch() { return buildPbcchRecord({0, 0}, timestamp()); }
    PlistData packetSystemInfo() { return buildPacketSystemInfoRecord({1, 2, 3, 0, 1, 0}, timestamp()); }
    PlistData gmmState() { return buildGmmStateRecord({3, 0, 0, 0}, timestamp()); }
    PlistData mmState() { return buildMmStateRecord({19, 8, 0, 0}, timestamp()); }
    PlistData registrationState() { return buildRegistrationStateRecord({1, 0, 0}, timestamp()); }
    PlistData registrationInfo() {
        return buildRegistrationInfoRecord({0, 3, plmnIdentityBytes("310", "410"), 0x1234, 7, 0},
                                           timestamp());
    }
    PlistData equivalentPlmns() {
        return buildEquivalentPlmnRecord({2, {3, 1, 1, 4, 0, 0, 3, 2, 1, 6, 0, 0}, 0}, timestamp());
    }

    // Extra records of the telephony service.
    PlistData cellMonitor() {
        std::vector<CellMonitorEntry> cells;
        CellMonitorEntry serving;
        serving.technology = kGsm;
        serving.cellType = kServing;
        serving.cellId = between(1, 65535);
        serving.arfcn = kArfcns[0];
        serving.mcc = 310;
        serving.mnc = 410;
        serving.lac = 0x1234;
        cells.push_back(serving);
        for (int k = 1; k < 7; ++k) {
            CellMonitorEntry neighbour;
            neighbour.technology = kGsm;
            neighbour.cellType = kNeighbor;
            neighbour.arfcn = kArfcns[static_cast<std::size_t>(k)];
            neighbour.rssi = between(-55, -20);
            cells.push_back(neighbour);
        }
        for (int k = 0; k < 3; ++k) {
            CellMonitorEntry neighbour;
            neighbour.technology = kUmts;
            neighbour.cellType = kNeighbor;
            neighbour.uarfcn = 10737;
            neighbour.psc = between(0, 511);
            neighbour.rscp = between(-110, -60);
            neighbour.ecn0 = between(-20, -3);
            cells.push_back(neighbour);
        }
        return buildCellMonitorEntries(cells, timestamp());
    }
    PlistData pdpContexts() {
        return buildPdpContextsRecord({{1, "internet", "IP", "10.64.12.7"}}, timestamp());
    }
    PlistData simFiles() {
        SimFilesRecord record;
        record.files = {{"kSimFile_ICCID", "8901410321111851072"},
                        {"kSimFile_MSISDN", "+15550100"},
                        {"kSimFile_AD", "00000002"},
                        {"kSimFile_FPLMN", "310260"}};
        return buildSimFilesRecord(record, timestamp());
    }

  private:
    static constexpr std::uint16_t kArfcns[] = {20, 23, 27, 31, 36, 40, 44, 51, 56, 60, 63, 70};
    // 40 ms per record: 32 ticks of 1/800 s, counted in the timestamp's upper 48 bits.
    std::uint64_t timestamp() { return clock_ += std::uint64_t{32} << 16; }
    std::mt19937 random_;
    std::uint64_t clock_ = 0;
};

// Phases of a drive: GSM idle (measurement cycles with BSIC lists and the GPRS records), a GSM call, UMTS
// idle, a UMTS data session; mobility and PLMN records at registration changes; extra records now and then.
const std::vector<PlistData>& gsmStream() {
    static const std::vector<PlistData> stream = [] {
        StreamMaker maker(20240601);
        std::vector<PlistData> out;
        for (int phase = 0; phase < 20; ++phase) {
            out.push_back(maker.registrationInfo());
            out.push_back(maker.registrationState());
            out.push_back(maker.mmState());
            out.push_back(maker.gmmState());
            out.push_back(maker.equivalentPlmns());
            out.push_back(maker.cellMonitor());
            // GSM idle.
            out.push_back(maker.servingIdentity());
            out.push_back(maker.gsmRrState());
            for (int cycle = 0; cycle < 60; ++cycle) {
                out.push_back(maker.gsmMeasurements());
                if (cycle % 5 == 0) {
                    out.push_back(maker.bsicList());
                }
                if (cycle % 20 == 0) {
                    out.push_back(maker.si13Position());
                    out.push_back(maker.gprsCellOptions());
                    out.push_back(maker.tbfParameters());
                    out.push_back(maker.pbcch());
                    out.push_back(maker.packetSystemInfo());
                    out.push_back(maker.cellMonitor());
                }
            }
            // GSM call.
            out.push_back(maker.gsmRrState());
            out.push_back(maker.dedicatedChannel());
            out.push_back(maker.mobileAllocation());
            out.push_back(maker.channelParameters());
            for (int report = 0; report < 30; ++report) {
                out.push_back(maker.gsmMeasurements());
            }
            // UMTS idle.
            out.push_back(maker.rrcState());
            out.push_back(maker.umtsCellIdentity());
            out.push_back(maker.registrationState());
            for (int cycle = 0; cycle < 40; ++cycle) {
                out.push_back(maker.umtsIdleCells());
                if (cycle % 4 == 0) {
                    out.push_back(maker.gsmIdleCells());
                }
                if (cycle % 20 == 0) {
                    out.push_back(maker.cellMonitor());
                }
            }
            // UMTS data session.
            out.push_back(maker.rrcState());
            out.push_back(maker.ciphering());
            out.push_back(maker.pdpContexts());
            for (int report = 0; report < 80; ++report) {
                out.push_back(maker.cellSets());
                out.push_back(maker.hsdpa());
                if (report % 2 == 0) {
                    out.push_back(maker.blockErrors());
                    out.push_back(maker.uplinkPower());
                }
            }
            out.push_back(maker.rrcState());
            if (phase % 10 == 0) {
                out.push_back(maker.simFiles());
            }
        }
        return out;
    }();
    return stream;
}

void feed(benchmark::State& state, const std::vector<PlistData>& blobs) {
    ORV_GSMLogGenerator generator;
    bench::feedCycle(state, generator, blobs, kRefreshEvery);
}

void BM_GsmStream(benchmark::State& state) {
    state.counters["blobs"] = static_cast<double>(gsmStream().size());
    feed(state, gsmStream());
}
BENCHMARK(BM_GsmStream);

// One code at a time: 64 different records of the code, cycled.
template <PlistData (StreamMaker::*Make)()>
void BM_GsmCode(benchmark::State& state) {
    StreamMaker maker(7);
    std::vector<PlistData> blobs;
    for (int k = 0; k < 64; ++k) {
        blobs.push_back((maker.*Make)());
    }
    feed(state, blobs);
}
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::gsmMeasurements)->Name("BM_GsmCode/0x5137");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::bsicList)->Name("BM_GsmCode/0x51FF");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::servingIdentity)->Name("BM_GsmCode/0x5134");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::dedicatedChannel)->Name("BM_GsmCode/0x5076");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::mobileAllocation)->Name("BM_GsmCode/0x51F8");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::umtsIdleCells)->Name("BM_GsmCode/0x4005-UMTS");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::gsmIdleCells)->Name("BM_GsmCode/0x4005-GSM");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::cellSets)->Name("BM_GsmCode/0x417A");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::hsdpa)->Name("BM_GsmCode/0x4221");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::blockErrors)->Name("BM_GsmCode/0x4116");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::uplinkPower)->Name("BM_GsmCode/0x4031");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::rrcState)->Name("BM_GsmCode/0x4125");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::umtsCellIdentity)->Name("BM_GsmCode/0x4127");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::ciphering)->Name("BM_GsmCode/0x4157");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::gsmRrState)->Name("BM_GsmCode/0x512C");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::channelParameters)->Name("BM_GsmCode/0x5072");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::si13Position)->Name("BM_GsmCode/0x51F4");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::gprsCellOptions)->Name("BM_GsmCode/0x51F5");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::tbfParameters)->Name("BM_GsmCode/0x51F6");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::pbcch)->Name("BM_GsmCode/0x51FB");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::packetSystemInfo)->Name("BM_GsmCode/0x51FD");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::gmmState)->Name("BM_GsmCode/0x7130");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::mmState)->Name("BM_GsmCode/0x7131");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::registrationState)->Name("BM_GsmCode/0x7132");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::registrationInfo)->Name("BM_GsmCode/0x7135");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::equivalentPlmns)->Name("BM_GsmCode/0x7150");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::cellMonitor)->Name("BM_GsmCode/0xFF0001");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::pdpContexts)->Name("BM_GsmCode/0xFF0002");
BENCHMARK_TEMPLATE(BM_GsmCode, &StreamMaker::simFiles)->Name("BM_GsmCode/0xFF0000");

}  // namespace
}  // namespace velmar

BENCHMARK_MAIN();
