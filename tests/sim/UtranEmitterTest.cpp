#include "service/sim/UtranEmitter.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <functional>
#include <string>

#include "LogGenerator/LogGenerator.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/plist/PlistCodec.h"
#include "tests/sim/EmitterTestSupport.h"
#include "tests/sim/SimDecoding.h"

namespace velmar::sim {
namespace {

using testing::BlobRecorder;
using testing::kTestStartTimestamp;
using testing::makeCell;
using testing::readLE;
using testing::run;

// Three UMTS cells on one carrier; RSCP = 33 dBm + path gain.
RadioSnapshot utranWorld() {
    RadioSnapshot snapshot;
    snapshot.cells = {
        makeCell(0, CellRat::Umts, 0x1230015, 8000, 17, 10713, 64),
        makeCell(1, CellRat::Umts, 0x1230016, 8000, 17, 10713, 72),
        makeCell(2, CellRat::Umts, 0x1230021, 8001, 18, 10713, 80),
    };
    snapshot.heard = {{0, -118.0, 0.0}, {1, -120.0, 0.0}, {2, -140.0, 0.0}};
    snapshot.servingCell = 0;
    snapshot.phase = ActivityPhase::Idle;
    snapshot.phaseTime = 5.0;
    return snapshot;
}

TEST(UtranEmitter, NeighbourMeasurementsEvery1280Milliseconds) {
    SimRandom random(3);
    UtranEmitter emitter(random);
    RadioSnapshot snapshot = utranWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 6.4, recorder);
    const std::vector<PlistData> measurements = recorder.packets(0xD00A);
    ASSERT_EQ(measurements.size(), 5u);
    EXPECT_EQ(BlobRecorder::timestampOf(measurements[0]), kTestStartTimestamp + (1024ULL << 16));
    EXPECT_EQ(recorder.count(0xD00E), 5u);
    EXPECT_EQ(recorder.count(0x0001, 0xFF), 5u);
    EXPECT_EQ(recorder.count(0xD00C), 0u);  // no RRC connection while idle
}

TEST(UtranEmitter, NeighbourEntriesCarryChannelIdentityLevelAndSet) {
    SimRandom random(3);
    UtranEmitter emitter(random);
    RadioSnapshot snapshot = utranWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 1.28, recorder);
    const PlistData record = recorder.packets(0xD00A).at(0);
    // Three cells: count 3 in bits 1..7 of byte 16.
    EXPECT_EQ(record[16], 3 << 1);
    // Entry 0 at 168: the serving cell, UARFCN 10713, parameter id 64 / 4 = 16, RSCP -85 dBm is 35 dB above
    // -120, active set, in the joint-detection set.
    const std::uint32_t word01 = readLE(record, 168, 2);
    EXPECT_EQ(word01 & 0x3FFF, 10713u);
    const std::uint32_t word12 = readLE(record, 169, 2);
    EXPECT_EQ((word12 >> 6) & 0x7F, 16u);
    const std::uint32_t word23 = readLE(record, 170, 2);
    EXPECT_EQ((word23 >> 5) & 0xFF, 35u);
    EXPECT_EQ((record[171] >> 5) & 0x3, 0);
    EXPECT_EQ(record[171] >> 7, 1);
    // Entry 1: the second cell (-87 dBm, 33 dB) is monitored while idle: no soft handover outside CELL_DCH.
    EXPECT_EQ((readLE(record, 186, 2) >> 5) & 0xFF, 33u);
    EXPECT_EQ((record[187] >> 5) & 0x3, 1);
    // Entry 2: -107 dBm is 13 dB; its Ec/Io is far below -18 dB, so it is only detected.
    EXPECT_EQ((readLE(record, 202, 2) >> 5) & 0xFF, 13u);
    EXPECT_EQ((record[203] >> 5) & 0x3, 2);
    EXPECT_EQ(record.size(), 168u + 3 * 16);
}

TEST(UtranEmitter, SoftHandoverCellJoinsTheActiveSetInCellDch) {
    SimRandom random(3);
    UtranEmitter emitter(random);
    RadioSnapshot snapshot = utranWorld();
    snapshot.phase = ActivityPhase::Connected;
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 1.28, recorder);
    const PlistData record = recorder.packets(0xD00A).at(0);
    EXPECT_EQ((record[187] >> 5) & 0x3, 0);  // within 3 dB of the serving cell
    EXPECT_EQ((record[203] >> 5) & 0x3, 2);
}

TEST(UtranEmitter, RrcStateFollowsTheConnection) {
    SimRandom random(3);
    UtranEmitter emitter(random);
    RadioSnapshot snapshot = utranWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 4.0, recorder, [](RadioSnapshot& s) {
        if (s.time < 1.0) {
            s.phase = ActivityPhase::Idle;
        } else if (s.time < 1.4) {
            s.phase = ActivityPhase::Connecting;
        } else if (s.time < 3.0) {
            s.phase = ActivityPhase::Connected;
        } else if (s.time < 3.5) {
            s.phase = ActivityPhase::Releasing;
        } else {
            s.phase = ActivityPhase::Idle;
        }
    });
    std::string modes;
    for (const PlistData& packet : recorder.packets(0xD0E0)) {
        EXPECT_EQ(packet[13], 1);  // the mode is valid
        modes += std::to_string(packet[14]) + " ";
    }
    EXPECT_EQ(modes, "0 1 3 2 0 ");  // disconnected, connecting, CELL_DCH, CELL_FACH, disconnected
    // Channel quality each second while connected: at 2 s (CELL_DCH) and 3 s (CELL_FACH), not at 1 s or 4 s.
    EXPECT_EQ(recorder.count(0xD00C), 2u);
}

TEST(UtranEmitter, ServingCellRecordAndCellMonitorAgree) {
    SimRandom random(3);
    UtranEmitter emitter(random);
    RadioSnapshot snapshot = utranWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 1.28, recorder);
    const PlistData serving = recorder.packets(0xD0E2).at(0);
    EXPECT_EQ(serving[15], 17);                       // URA
    EXPECT_EQ(readLE(serving, 17, 2), 10713u - 950);  // uplink UARFCN
    EXPECT_EQ(readLE(serving, 19, 2), 10713u);        // downlink UARFCN
    EXPECT_EQ(readLE(serving, 21, 4), 0x1230015u);
    EXPECT_EQ(serving[25] & 1, 0);  // all calls allowed
    const PlistData monitor = recorder.packets(0x0001, 0xFF).at(0);
    const std::optional<PlistValue> parsed = parsePropertyList(ByteView(monitor).subspan(13));
    ASSERT_TRUE(parsed && parsed->isArray());
    ASSERT_EQ(parsed->array()->size(), 3u);
    const PlistDictionaryRef& cell = parsed->array()->at(0).dictionary();
    EXPECT_EQ(*cell->get(kKxCellMonitorCellRadioAccessTechnology).string(),
              "kKxCellMonitorRadioAccessTechnologyUTRAN2");
    EXPECT_EQ(*cell->get(kKxCellMonitorCellType).string(), "kKxCellMonitorCellTypeServing");
    EXPECT_EQ(cell->get(kKxCellMonitorCellId).integerValue(), 0x1230015);
    EXPECT_EQ(cell->get(kKxCellMonitorLAC).integerValue(), 8000);
    EXPECT_EQ(cell->get(kKxCellMonitorSCN).integerValue(), 64);
    EXPECT_EQ(cell->get(kKxCellMonitorUARFCN).integerValue(), 10713);
    EXPECT_EQ(cell->get(kKxCellMonitorBandInfo).integerValue(), 1);
    EXPECT_EQ(*parsed->array()->at(1).dictionary()->get(kKxCellMonitorCellType).string(),
              "kKxCellMonitorCellTypeNeighbor");
}

TEST(UtranEmitter, SameSnapshotsAndSeedGiveSameBytes) {
    const auto bytesFor = [](std::uint64_t seed) {
        SimRandom random(seed);
        UtranEmitter emitter(random);
        RadioSnapshot snapshot = utranWorld();
        snapshot.phase = ActivityPhase::Connected;
        snapshot.dataSession = true;
        BlobRecorder recorder;
        run(emitter, snapshot, 0.0, 5.0, recorder);
        return recorder.blobs;
    };
    const std::vector<PlistData> first = bytesFor(5);
    EXPECT_EQ(first, bytesFor(5));
    EXPECT_NE(first, bytesFor(6));  // SIR and BLER are drawn
}

TEST(UtranEmitter, DecodedDisplayShowsTheSimulatedCell) {
    SimRandom random(3);
    UtranEmitter emitter(random);
    RadioSnapshot snapshot = utranWorld();
    snapshot.phase = ActivityPhase::Connected;
    snapshot.dataSession = true;
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 2.0, recorder);
    std::unique_ptr<LogGenerator> generator =
        LogGenerator::generatorFromTechnology(kKxLogChannelTechnology_Orvane_UTRAN2);
    ASSERT_NE(generator, nullptr);
    const StateDict state = PlistDictionary::create();
    for (const PlistData& blob : recorder.blobs) {
        generator->updateState(state, blob);
    }
    generator->generateLogUsingState(state);
    const PlistValue display = state->get("Display");
    ASSERT_TRUE(display.isDictionary());
    const auto section = [&](std::string_view name) -> PlistValue {
        std::function<PlistValue(const PlistValue&)> find = [&](const PlistValue& value) -> PlistValue {
            if (value.isDictionary()) {
                for (const auto& [key, child] : *value.dictionary()) {
                    if (key == name) {
                        return child;
                    }
                    PlistValue found = find(child);
                    if (!found.isNone()) {
                        return found;
                    }
                }
            }
            return PlistValue();
        };
        return find(display);
    };
    const PlistValue rrc = section("RRC Info");
    ASSERT_TRUE(rrc.isDictionary());
    EXPECT_EQ(*rrc.dictionary()->get("State").string(), "Cell DCH");
    const PlistValue serving = section("Serving Cell Info");
    ASSERT_TRUE(serving.isDictionary());
    EXPECT_EQ(*serving.dictionary()->get("Cell ID").string(), std::to_string(0x1230015));
    EXPECT_EQ(*serving.dictionary()->get("Cell Scrambling Code").string(), "64");
    const PlistValue neighbours = section("Neighbor Cell List");
    ASSERT_TRUE(neighbours.isArray());
    ASSERT_EQ(neighbours.array()->size(), 3u);
    EXPECT_EQ(*neighbours.array()->at(0).dictionary()->get("Status").string(), "ASET");
    EXPECT_EQ(*neighbours.array()->at(0).dictionary()->get("Filter RSCP").string(), "0.136719");  // 35 / 256
    const PlistValue bler = section("TRCH BLER");
    ASSERT_TRUE(bler.isArray());
    ASSERT_EQ(bler.array()->size(), 2u);
    EXPECT_EQ(*bler.array()->at(0).dictionary()->get("TRCH ID").string(), "5");
    const PlistValue sir = section("CCTRCH SIR");
    ASSERT_TRUE(sir.isArray());
    EXPECT_EQ(sir.array()->size(), 1u);
}

}  // namespace
}  // namespace velmar::sim

namespace velmar::testing {
namespace {

bool sectionFilled(const PlistValue& section) {
    return (section.isDictionary() && !section.dictionary()->empty()) ||
           (section.isArray() && !section.array()->empty());
}

TEST(UtranSimulation, ThirtySecondsFillEveryFillableSection) {
    SimDecodingSettings settings;
    settings.technology = "utran";
    const SimDecodingResult result = runSimDecoding(settings);
    const PlistValue display = result.display();
    ASSERT_TRUE(display.isDictionary());
    for (const char* name : {"RRC Info", "Serving Cell Info", "Neighbor Cell List", "TRCH BLER", "CCTRCH SIR",
                             "SIM Info", "PDP Context Info"}) {
        EXPECT_TRUE(sectionFilled(findInDisplay(display, name))) << name;
    }
    // The decoder of the GSM neighbour list never installs its rows.
    EXPECT_FALSE(sectionFilled(findInDisplay(display, "GSM Neighbor Cell List")));

    const PlistValue rrc = findInDisplay(display, "RRC Info");
    ASSERT_TRUE(rrc.isDictionary());
    EXPECT_NE(rrc.dictionary()->get("State"), PlistValue("Unknown RRC Mode"));
    const PlistValue serving = findInDisplay(display, "Serving Cell Info");
    ASSERT_TRUE(serving.isDictionary());
    EXPECT_EQ(serving.dictionary()->get("Downlink UARFCN"), PlistValue("10713"));
    EXPECT_EQ(serving.dictionary()->get("Freq Band Indicator"), PlistValue("1"));
    EXPECT_EQ(serving.dictionary()->get("Allowed Access"), PlistValue("All Calls"));
    const PlistValue neighbours = findInDisplay(display, "Neighbor Cell List");
    for (const PlistValue& row : neighbours.array()->items()) {
        // RSCP above the -120 dBm floor, at most 95 dB (-25 dBm), in 1/256.
        const double filtered = std::atof(row.dictionary()->get("Filter RSCP").string()->c_str());
        EXPECT_GE(filtered, 0.0);
        EXPECT_LE(filtered, 95.0 / 256.0 + 1e-6);
        EXPECT_EQ(row.dictionary()->get("UARFCN"), PlistValue("10713"));
    }
    const PlistValue bler = findInDisplay(display, "TRCH BLER");
    for (const PlistValue& row : bler.array()->items()) {
        const int percent = std::atoi(row.dictionary()->get("TRCH BLER Measurement").string()->c_str());
        EXPECT_GE(percent, 0);
        EXPECT_LE(percent, 100);
    }
}

TEST(UtranSimulation, SameSeedSameBytesOtherSeedOtherBytes) {
    SimDecodingSettings settings;
    settings.technology = "utran";
    settings.decode = false;
    const std::vector<PlistData> first = runSimDecoding(settings).blobs;
    EXPECT_EQ(first, runSimDecoding(settings).blobs);
    settings.seed = 2;
    EXPECT_NE(first, runSimDecoding(settings).blobs);
}

}  // namespace
}  // namespace velmar::testing
