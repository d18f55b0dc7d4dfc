#include "service/sim/GsmEmitter.h"

#include <gtest/gtest.h>

#include <cstdlib>
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

// Three GSM cells (two in location area 8000, one in 8001) and a UMTS cell. Path gains are chosen so that the
// figures come out whole: GSM RSSI = 43 dBm + gain, UMTS RSCP = 33 dBm + gain.
RadioSnapshot gsmWorld() {
    RadioSnapshot snapshot;
    snapshot.cells = {
        makeCell(0, CellRat::Gsm, 20003, 8000, 17, 17, 35),
        makeCell(1, CellRat::Gsm, 20011, 8000, 17, 20, 12),
        makeCell(2, CellRat::Umts, 0x1230015, 8000, 17, 10713, 64),
        makeCell(3, CellRat::Gsm, 20021, 8001, 18, 23, 20),
    };
    snapshot.heard = {{0, -138.0, 0.0}, {1, -143.0, 0.0}, {2, -120.0, 0.0}};
    snapshot.servingCell = 0;
    snapshot.phase = ActivityPhase::Idle;
    snapshot.phaseTime = 5.0;
    return snapshot;
}

// The same world camped on the UMTS cell in a data connection.
RadioSnapshot umtsConnected() {
    RadioSnapshot snapshot = gsmWorld();
    snapshot.servingCell = 2;
    snapshot.phase = ActivityPhase::Connected;
    snapshot.dataSession = true;
    snapshot.throughputKbps = 3600;
    return snapshot;
}

const PlistValue* findKey(const PlistValue& value, std::string_view key) {
    if (value.isDictionary()) {
        for (const auto& [name, child] : *value.dictionary()) {
            if (name == key) {
                return &child;
            }
            if (const PlistValue* found = findKey(child, key)) {
                return found;
            }
        }
    } else if (value.isArray()) {
        for (const PlistValue& child : value.array()->items()) {
            if (const PlistValue* found = findKey(child, key)) {
                return found;
            }
        }
    }
    return nullptr;
}

std::string text(const PlistValue* section, std::string_view key) {
    if (section == nullptr || !section->isDictionary()) {
        return "<no section>";
    }
    const PlistValue* value = section->dictionary()->find(key);
    return value != nullptr && value->isString() ? *value->string() : "<missing>";
}

TEST(GsmEmitter, MeasurementReportsEvery480Milliseconds) {
    SimRandom random(7);
    GsmEmitter emitter(random);
    RadioSnapshot snapshot = gsmWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 4.8, recorder);
    const std::vector<PlistData> reports = recorder.packets(0x5137);
    ASSERT_EQ(reports.size(), 10u);
    // 480 ms = 384 ticks of 1/800 s, in the upper 48 bits of the timestamp.
    EXPECT_EQ(BlobRecorder::timestampOf(reports.front()), kTestStartTimestamp + (384ULL << 16));
    EXPECT_EQ(BlobRecorder::timestampOf(reports.back()), kTestStartTimestamp + (3840ULL << 16));
}

TEST(GsmEmitter, MeasurementReportCarriesServingAndNeighbourLevels) {
    SimRandom random(7);
    GsmEmitter emitter(random);
    RadioSnapshot snapshot = gsmWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 0.5, recorder);
    const std::vector<PlistData> reports = recorder.packets(0x5137);
    ASSERT_EQ(reports.size(), 1u);
    const PlistData& report = reports.front();
    // Serving: 43 - 138 = -95 dBm, logged as 95; RxLev 15, C1 = 15 - 6 = 9, no reselect offset on cell 0.
    EXPECT_EQ(report[15], 95);
    EXPECT_EQ(readLE(report, 16, 4), 9u);
    EXPECT_EQ(readLE(report, 20, 4), 9u);
    EXPECT_EQ(report[26], 2);  // hysteresis applied
    // One GSM neighbour: ARFCN 20 at 43 - 143 = -100 dBm, RxLev 10, C1 4. The UMTS cell is not listed.
    ASSERT_EQ(report[28], 1);
    EXPECT_EQ(readLE(report, 29, 2), 20u);
    EXPECT_EQ(report[31], 100);
    EXPECT_EQ(readLE(report, 32, 4), 4u);
    EXPECT_EQ(report.size(), 29u + 14u);
}

TEST(GsmEmitter, BsicListPrecedesFirstReportAndEveryFifth) {
    SimRandom random(7);
    GsmEmitter emitter(random);
    RadioSnapshot snapshot = gsmWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 4.8, recorder);
    const std::vector<PlistData> lists = recorder.packets(0x51FF);
    ASSERT_EQ(lists.size(), 2u);  // before reports 1 and 6
    const PlistData& list = lists.front();
    ASSERT_EQ(list[14], 2);
    EXPECT_EQ(readLE(list, 15, 2), 17u);
    EXPECT_EQ(list[17], 35);
    EXPECT_EQ(readLE(list, 19, 2), 20u);
    EXPECT_EQ(list[21], 12);
    std::size_t firstList = 0;
    std::size_t firstReport = 0;
    for (std::size_t i = recorder.blobs.size(); i-- > 0;) {
        if (BlobRecorder::codeOf(recorder.blobs[i]) == 0x51FF) {
            firstList = i;
        } else if (BlobRecorder::codeOf(recorder.blobs[i]) == 0x5137) {
            firstReport = i;
        }
    }
    EXPECT_LT(firstList, firstReport);
}

TEST(GsmEmitter, CampedIdleStatesAndRegistration) {
    SimRandom random(7);
    GsmEmitter emitter(random);
    RadioSnapshot snapshot = gsmWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 0.0, recorder);
    ASSERT_EQ(recorder.count(0x7132), 1u);
    EXPECT_EQ(recorder.packets(0x7132)[0][13], 1);  // REG_STATE_IDLE
    const PlistData mm = recorder.packets(0x7131).at(0);
    EXPECT_EQ(mm[13], 19);  // MM_IDLE
    EXPECT_EQ(mm[14], 8);   // MM_NORMAL_SERVICE
    EXPECT_EQ(mm[15], 0);   // UPDATED
    const PlistData gmm = recorder.packets(0x7130).at(0);
    EXPECT_EQ(gmm[13], 3);  // GMM_REGISTERED
    const PlistData rr = recorder.packets(0x512C).at(0);
    EXPECT_EQ(rr[13], 5);                              // RR_IDLE
    EXPECT_EQ(rr[16], 0);                              // voice mode: no data session
    EXPECT_EQ(recorder.packets(0x4125).at(0)[13], 0);  // the UMTS RRC is disconnected on a GSM cell
    // Registration information: PLMN 001-01 as BCD (0x00, 0xF1, 0x10), LAC 8000 = 0x1F40 big-endian, RAC 17.
    const PlistData registration = recorder.packets(0x7135).at(0);
    EXPECT_EQ(registration[15], 0x00);
    EXPECT_EQ(registration[16], 0xF1);
    EXPECT_EQ(registration[17], 0x10);
    EXPECT_EQ(registration[18], 0x1F);
    EXPECT_EQ(registration[19], 0x40);
    EXPECT_EQ(registration[20], 17);
    EXPECT_EQ(registration[14], 3);  // CS and PS service
    // The equivalent PLMN list holds 001-01 as interleaved digits.
    const PlistData equivalent = recorder.packets(0x7150).at(0);
    EXPECT_EQ(equivalent[16], 1);
    const std::uint8_t digits[] = {0, 0, 0, 0, 1, 1};
    for (std::size_t i = 0; i < 6; ++i) {
        EXPECT_EQ(equivalent[17 + i], digits[i]) << i;
    }
    // The SIM files go out with the first snapshot.
    EXPECT_EQ(recorder.count(0x0000, 0xFF), 1u);
}

TEST(GsmEmitter, StatesFollowRegistrationThenIdle) {
    SimRandom random(7);
    GsmEmitter emitter(random);
    RadioSnapshot snapshot = gsmWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 3.0, recorder, [](RadioSnapshot& s) {
        if (s.time < 1.0) {
            s.phase = ActivityPhase::PowerOn;
            s.servingCell = -1;
            s.phaseTime = s.time;
        } else if (s.time < 2.0) {
            s.phase = ActivityPhase::Registering;
            s.servingCell = 0;
            s.phaseTime = s.time - 1.0;
        } else {
            s.phase = ActivityPhase::Idle;
            s.phaseTime = s.time - 2.0;
        }
    });
    std::string registration;
    for (const PlistData& packet : recorder.packets(0x7132)) {
        registration += std::to_string(packet[13]) + " ";
    }
    EXPECT_EQ(registration, "5 2 1 ");  // automatic search, registering, idle
    std::string mm;
    for (const PlistData& packet : recorder.packets(0x7131)) {
        mm += std::to_string(packet[13]) + " ";
    }
    EXPECT_EQ(mm, "19 13 3 19 ");  // idle (searching), wait for RR (LU), LU initiated, idle
    std::string rr;
    for (const PlistData& packet : recorder.packets(0x512C)) {
        rr += std::to_string(packet[13]) + " ";
    }
    EXPECT_EQ(rr, "3 7 9 5 ");  // cell selection, connection pending, data transfer, idle
    ASSERT_EQ(recorder.count(0x7135), 1u);
    EXPECT_EQ(BlobRecorder::timestampOf(recorder.packets(0x7135)[0]), kTestStartTimestamp + (1600ULL << 16));
}

TEST(GsmEmitter, AreaUpdateAfterMovingToAnotherLocationArea) {
    SimRandom random(7);
    GsmEmitter emitter(random);
    RadioSnapshot snapshot = gsmWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 4.0, recorder, [](RadioSnapshot& s) {
        if (s.time >= 2.0) {
            s.servingCell = 3;
            s.heard = {{3, -140.0, 0.0}, {0, -141.0, 0.0}};
        }
    });
    std::string registration;
    for (const PlistData& packet : recorder.packets(0x7132)) {
        registration += std::to_string(packet[13]) + " ";
    }
    EXPECT_EQ(registration, "1 2 1 ");
    std::string rr;
    for (const PlistData& packet : recorder.packets(0x512C)) {
        rr += std::to_string(packet[13]) + " ";
    }
    EXPECT_EQ(rr, "5 6 5 ");  // idle, cell reselection, idle
    const std::vector<PlistData> registrations = recorder.packets(0x7135);
    ASSERT_EQ(registrations.size(), 2u);
    // LAC 8001 = 0x1F41, RAC 18, reported 1.2 s after the reselection at 2.0 s: tick 2560.
    EXPECT_EQ(registrations[1][18], 0x1F);
    EXPECT_EQ(registrations[1][19], 0x41);
    EXPECT_EQ(registrations[1][20], 18);
    EXPECT_EQ(BlobRecorder::timestampOf(registrations[1]), kTestStartTimestamp + (2560ULL << 16));
    // The new cell's identity goes out at the reselection.
    const std::vector<PlistData> identities = recorder.packets(0x5134);
    ASSERT_FALSE(identities.empty());
    EXPECT_EQ(readLE(identities.back(), 17, 2), 20021u);
    EXPECT_EQ(readLE(identities.back(), 13, 2), 23u);
}

TEST(GsmEmitter, UmtsCellSetsEvery200MillisecondsInCellDch) {
    SimRandom random(7);
    GsmEmitter emitter(random);
    RadioSnapshot snapshot = umtsConnected();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 1.0, recorder);
    const std::vector<PlistData> sets = recorder.packets(0x417A);
    ASSERT_EQ(sets.size(), 5u);
    const PlistData& set = sets.front();
    // Carrier power: noise -100 dBm plus the cell's carrier at -87 + 7 = -80 dBm gives -79.957 dBm;
    // P = round((-79.957 + 106) * 10) - 512 = 260 - 512 = -252.
    EXPECT_EQ(static_cast<std::int16_t>(readLE(set, 13, 2)), -252);
    ASSERT_EQ(set[15], 1);
    EXPECT_EQ(readLE(set, 16 + 7, 2), 64u);  // PSC 64, active set (type 0)
    // Ec/Io = -87 - (-79.957) = -7.043 dB; 524288 * 10^(-0.7043) = 103573.
    EXPECT_EQ(readLE(set, 16 + 15 + 32, 4), 103573u);
    EXPECT_EQ(recorder.count(0x4116), 1u);
    EXPECT_EQ(recorder.count(0x4031), 1u);
    const PlistData hsdpa = recorder.packets(0x4221).at(0);
    EXPECT_EQ(hsdpa[14], 500 & 0xFF);  // 500 sub-frames in the second
    EXPECT_EQ(hsdpa[15], 500 >> 8);    // single carrier
    EXPECT_EQ(hsdpa[16], 6);           // six HARQ processes
    // 3600 kbps over six processes: 600000 bits each.
    EXPECT_EQ(readLE(hsdpa, 18 + 1, 4), 600000u);
    const PlistData bler = recorder.packets(0x4116).at(0);
    EXPECT_EQ(bler[13], 2);  // PS data and signalling channels
    EXPECT_EQ(readLE(bler, 14, 2), 100u);
    EXPECT_EQ(bler[16], 5);
    EXPECT_EQ(readLE(bler, 17, 4), 100u);
    // Open-loop transmit power 33 + 87 - 113 = 7 dBm (jittered by about 1 dB) in five readings.
    const PlistData power = recorder.packets(0x4031).at(0);
    ASSERT_EQ(power[14], 5);
    const auto reading = static_cast<std::int16_t>(readLE(power, 16 + 4, 2));
    const int txDbm = (reading + 512) / 10 - 70;
    EXPECT_GE(txDbm, 2);
    EXPECT_LE(txDbm, 12);
    // The connected UMTS cell shows CELL_DCH and ciphering.
    EXPECT_EQ(recorder.packets(0x4125).at(0)[13], 3);
    EXPECT_EQ(recorder.packets(0x4157).at(0)[13], 1);
}

TEST(GsmEmitter, UmtsIdleMeasurementsListBothLayers) {
    SimRandom random(7);
    GsmEmitter emitter(random);
    RadioSnapshot snapshot = umtsConnected();
    snapshot.phase = ActivityPhase::Idle;
    snapshot.dataSession = false;
    snapshot.throughputKbps = 0;
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 1.28, recorder);
    const std::vector<PlistData> measurements = recorder.packets(0x4005);
    ASSERT_EQ(measurements.size(), 2u);
    const PlistData& umts = measurements[0];
    ASSERT_EQ(umts[13], 1);
    EXPECT_EQ(umts[14], 0);
    EXPECT_EQ(readLE(umts, 15, 2), 10713u);
    EXPECT_EQ(readLE(umts, 17, 2), 64u);
    EXPECT_EQ(static_cast<std::int8_t>(umts[19]), -87 + 21);
    EXPECT_EQ(static_cast<std::int8_t>(umts[22]), -14);  // -7.04 dB in half dB
    const PlistData& gsm = measurements[1];
    EXPECT_EQ(gsm[13], 0);
    ASSERT_EQ(gsm[14], 2);
    EXPECT_EQ(readLE(gsm, 15, 2), 17u);
    EXPECT_EQ(readLE(gsm, 17, 2), 35u);
    EXPECT_EQ(static_cast<std::int8_t>(gsm[19]), -95);
    EXPECT_EQ(recorder.count(0x417A), 0u);  // no cell sets outside CELL_DCH
}

TEST(GsmEmitter, CellMonitorAgreesWithMeasurements) {
    SimRandom random(7);
    GsmEmitter emitter(random);
    RadioSnapshot snapshot = gsmWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 1.28, recorder);
    const std::vector<PlistData> monitors = recorder.packets(0x0001, 0xFF);
    ASSERT_EQ(monitors.size(), 1u);
    const PlistData& packet = monitors.front();
    const std::optional<PlistValue> parsed = parsePropertyList(ByteView(packet).subspan(13));
    ASSERT_TRUE(parsed && parsed->isArray());
    const PlistArrayRef& cells = parsed->array();
    ASSERT_EQ(cells->size(), 3u);
    const auto number = [](const PlistValue& cell, std::string_view key) {
        const PlistValue* value = cell.dictionary()->find(key);
        return value != nullptr ? value->integerValue().value_or(-9999) : -9999;
    };
    const auto string = [](const PlistValue& cell, std::string_view key) {
        const PlistValue* value = cell.dictionary()->find(key);
        return value != nullptr && value->isString() ? *value->string() : std::string("<missing>");
    };
    const PlistValue& serving = cells->at(0);
    EXPECT_EQ(string(serving, kKxCellMonitorCellRadioAccessTechnology),
              "kKxCellMonitorRadioAccessTechnologyGSM");
    EXPECT_EQ(string(serving, kKxCellMonitorCellType), "kKxCellMonitorCellTypeServing");
    EXPECT_EQ(number(serving, kKxCellMonitorCellId), 20003);
    EXPECT_EQ(number(serving, kKxCellMonitorARFCN), 17);
    EXPECT_EQ(number(serving, kKxCellMonitorRSSI), -48);  // -95 dBm in 2 dB units, rounded
    EXPECT_EQ(number(serving, kKxCellMonitorLAC), 8000);
    EXPECT_EQ(number(serving, kKxCellMonitorMCC), 1);
    EXPECT_EQ(number(serving, kKxCellMonitorMNC), 1);
    const PlistValue& gsmNeighbour = cells->at(1);
    EXPECT_EQ(string(gsmNeighbour, kKxCellMonitorCellType), "kKxCellMonitorCellTypeNeighbor");
    EXPECT_EQ(number(gsmNeighbour, kKxCellMonitorARFCN), 20);
    EXPECT_EQ(number(gsmNeighbour, kKxCellMonitorRSSI), -50);
    const PlistValue& umtsNeighbour = cells->at(2);
    EXPECT_EQ(string(umtsNeighbour, kKxCellMonitorCellRadioAccessTechnology),
              "kKxCellMonitorRadioAccessTechnologyUMTS");
    EXPECT_EQ(number(umtsNeighbour, kKxCellMonitorUARFCN), 10713);
    EXPECT_EQ(number(umtsNeighbour, kKxCellMonitorPSC), 64);
    EXPECT_EQ(number(umtsNeighbour, kKxCellMonitorRSCP), -87);
    EXPECT_EQ(number(umtsNeighbour, kKxCellMonitorEcN0), -7);
}

TEST(GsmEmitter, PdpContextsFollowTheDataSession) {
    SimRandom random(7);
    GsmEmitter emitter(random);
    RadioSnapshot snapshot = gsmWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 3.0, recorder,
        [](RadioSnapshot& s) { s.dataSession = s.time >= 1.0 && s.time < 2.0; });
    const std::vector<PlistData> contexts = recorder.packets(0x0002, 0xFF);
    ASSERT_EQ(contexts.size(), 2u);
    const std::optional<PlistValue> up = parsePropertyList(ByteView(contexts[0]).subspan(13));
    ASSERT_TRUE(up && up->isArray());
    ASSERT_EQ(up->array()->size(), 1u);
    const PlistValue* apn = up->array()->at(0).dictionary()->find("APN");
    ASSERT_NE(apn, nullptr);
    EXPECT_EQ(*apn->string(), "internet.test");
    const std::optional<PlistValue> down = parsePropertyList(ByteView(contexts[1]).subspan(13));
    ASSERT_TRUE(down && down->isArray());
    EXPECT_EQ(down->array()->size(), 0u);
}

TEST(GsmEmitter, SimFilesAtStartAndEveryTenSeconds) {
    SimRandom random(7);
    GsmEmitter emitter(random);
    RadioSnapshot snapshot = gsmWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 20.0, recorder);
    const std::vector<PlistData> sims = recorder.packets(0x0000, 0xFF);
    ASSERT_EQ(sims.size(), 3u);
    EXPECT_EQ(BlobRecorder::timestampOf(sims[2]), kTestStartTimestamp + (16000ULL << 16));
}

TEST(GsmEmitter, SameSnapshotsAndSeedGiveSameBytes) {
    const auto bytesFor = [](std::uint64_t seed) {
        SimRandom random(seed);
        GsmEmitter emitter(random);
        RadioSnapshot snapshot = umtsConnected();
        BlobRecorder recorder;
        run(emitter, snapshot, 0.0, 5.0, recorder);
        return recorder.blobs;
    };
    const std::vector<PlistData> first = bytesFor(11);
    EXPECT_EQ(first, bytesFor(11));
    EXPECT_NE(first, bytesFor(12));  // block errors and transmit power are drawn
}

TEST(GsmEmitter, DecodedDisplayShowsTheSimulatedCell) {
    SimRandom random(7);
    GsmEmitter emitter(random);
    RadioSnapshot snapshot = gsmWorld();
    BlobRecorder recorder;
    run(emitter, snapshot, 0.0, 3.0, recorder);
    std::unique_ptr<LogGenerator> generator =
        LogGenerator::generatorFromTechnology(kKxLogChannelTechnology_Orvane_GSM);
    ASSERT_NE(generator, nullptr);
    const StateDict state = PlistDictionary::create();
    for (const PlistData& blob : recorder.blobs) {
        generator->updateState(state, blob);
    }
    generator->generateLogUsingState(state);
    const PlistValue display = state->get("Display");
    const PlistValue* serving = findKey(display, "GSM Serving Cell");
    EXPECT_EQ(text(serving, "Cell ID"), "20003");
    EXPECT_EQ(text(serving, "ARFCN"), "17");
    EXPECT_EQ(text(serving, "BSIC"), "35");
    EXPECT_EQ(text(serving, "RSSI"), "95 dBm");
    EXPECT_EQ(text(serving, "C1 Value"), "9");
    const PlistValue* rr = findKey(display, "GSM RR Info");
    EXPECT_EQ(text(rr, "RR State"), "RR_IDLE");
    EXPECT_EQ(text(rr, "RR Mode"), "Voice");
    const PlistValue* plmn = findKey(display, "Serving PLMN");
    EXPECT_EQ(text(plmn, "Location Area Code"), "8000");
    EXPECT_EQ(text(plmn, "Routing Area Code"), "17");
    const PlistValue* cs = findKey(display, "Process CS");
    EXPECT_EQ(text(cs, "MM State"), "MM_IDLE");
    EXPECT_EQ(text(cs, "MM Service State"), "REG_STATE_IDLE");
    // The last writer of the neighbour list is the report at 2.88 s: ARFCN 20 with its BSIC.
    const PlistValue* neighbours = findKey(display, "Neighboring Cells");
    ASSERT_TRUE(neighbours != nullptr && neighbours->isArray());
    ASSERT_EQ(neighbours->array()->size(), 1u);
    const PlistValue& row = neighbours->array()->at(0);
    EXPECT_EQ(text(&row, "ARFCN"), "20");
    EXPECT_EQ(text(&row, "RSSI"), "100");
    EXPECT_EQ(text(&row, "C1 Value"), "4");
    EXPECT_EQ(text(&row, "BSIC"), "12");
}

}  // namespace
}  // namespace velmar::sim

namespace velmar::testing {
namespace {

bool sectionFilled(const PlistValue& section) {
    return (section.isDictionary() && !section.dictionary()->empty()) ||
           (section.isArray() && !section.array()->empty());
}

// The leading integer of a display text ("-87 dBm" -> -87).
int leadingNumber(const PlistValue& value) {
    return value.isString() ? std::atoi(value.string()->c_str()) : 9999;
}

// Every row of a list section has `key` within [low, high].
void expectRowsWithin(const PlistValue& display, std::string_view section, std::string_view key, int low,
                      int high) {
    const PlistValue rows = findInDisplay(display, section);
    ASSERT_TRUE(rows.isArray()) << section;
    for (const PlistValue& row : rows.array()->items()) {
        const PlistValue* value = row.dictionary()->find(key);
        ASSERT_NE(value, nullptr) << section << " " << key;
        const int number = leadingNumber(*value);
        EXPECT_GE(number, low) << section << " " << key << " " << *value->string();
        EXPECT_LE(number, high) << section << " " << key << " " << *value->string();
    }
}

// The sections that the GSM/UMTS decoders can fill; the placeholders and the three cell sets that the
// decoders always leave empty are not among them.
constexpr const char* kFillableSections[] = {
    "GSM Serving Cell", "Neighboring Cells", "GSM RR Info",  "Mobile Allocation",
    "GPRS Information", "UMTS RR Info",      "Active Set",   "UMTS Set",
    "GSM Set",          "HSDPA Info",        "BLER",         "Process CO",
    "Process CS",       "Process PS",        "Serving PLMN", "Equivalent PLMN List",
    "SIM Info",         "PDP Context Info",
};
constexpr const char* kAlwaysEmptySections[] = {
    "Coding Scheme", "Cell Change Counters", "UMTS RR Measurement", "Detected Set",
    "Monitored Set", "Virtual Active Set",   "Non-Ranked UMTS Set", "Non-Ranked GSM Set",
};

void expectPhysicalRanges(const PlistValue& display) {
    const PlistValue serving = findInDisplay(display, "GSM Serving Cell");
    ASSERT_TRUE(serving.isDictionary());
    const int rssi = leadingNumber(serving.dictionary()->get("RSSI"));  // logged as the level's magnitude
    EXPECT_GE(rssi, 47);
    EXPECT_LE(rssi, 110);
    expectRowsWithin(display, "Active Set", "RSCP", -125, -20);
    expectRowsWithin(display, "Active Set", "Energy Per Chip", -31, 0);
    expectRowsWithin(display, "UMTS Set", "RSCP", -120, -25);
    expectRowsWithin(display, "UMTS Set", "Energy Per Chip", -24, 0);
    expectRowsWithin(display, "GSM Set", "RSSI", -110, -47);
    const PlistValue rr = findInDisplay(display, "GSM RR Info");
    ASSERT_TRUE(rr.isDictionary());
    EXPECT_NE(rr.dictionary()->get("RR State"), PlistValue("Unknown"));
    const PlistValue umts = findInDisplay(display, "UMTS RR Info");
    ASSERT_TRUE(umts.isDictionary());
    const int power = leadingNumber(umts.dictionary()->get("Transmit Power"));
    EXPECT_GE(power, -50);
    EXPECT_LE(power, 24);
}

// Seed 14 on the drive route leaves UMTS coverage after about a minute and falls back to GSM with its PDP
// context kept, so a 72 s run passes through every kind of record: UMTS idle and CELL_DCH with data, then a
// GSM cell in packet idle.
TEST(GsmSimulation, DriveThroughBothLayersFillsEveryFillableSection) {
    SimDecodingSettings settings;
    settings.technology = "gsm";
    settings.seed = 14;
    settings.seconds = 72;
    const SimDecodingResult result = runSimDecoding(settings);
    const PlistValue display = result.display();
    ASSERT_TRUE(display.isDictionary());
    for (const char* name : kFillableSections) {
        EXPECT_TRUE(sectionFilled(findInDisplay(display, name))) << name;
    }
    for (const char* name : kAlwaysEmptySections) {
        EXPECT_FALSE(sectionFilled(findInDisplay(display, name))) << name;
    }
    expectPhysicalRanges(display);
    EXPECT_GE(result.snapshots.back().servingChanges, 1u);
}

// In the first 30 s the device registers and starts a data connection on UMTS: every section but the two
// that only a GSM serving cell fills is filled.
TEST(GsmSimulation, ThirtySecondsFillTheUmtsAndSharedSections) {
    SimDecodingSettings settings;
    settings.technology = "gsm";
    const SimDecodingResult result = runSimDecoding(settings);
    const PlistValue display = result.display();
    ASSERT_TRUE(display.isDictionary());
    for (const char* name : kFillableSections) {
        const std::string_view section = name;
        if (section == "GSM Serving Cell" || section == "Mobile Allocation") {
            continue;
        }
        EXPECT_TRUE(sectionFilled(findInDisplay(display, name))) << name;
    }
    const PlistValue umts = findInDisplay(display, "UMTS RR Info");
    ASSERT_TRUE(umts.isDictionary());
    EXPECT_EQ(umts.dictionary()->get("RRC State"), PlistValue("CELL_DCH"));
    EXPECT_EQ(umts.dictionary()->get("Ciphering"), PlistValue("Enabled"));
    expectRowsWithin(display, "Active Set", "RSCP", -125, -20);
    expectRowsWithin(display, "UMTS Set", "RSCP", -120, -25);
}

TEST(GsmSimulation, SameSeedSameBytesOtherSeedOtherBytes) {
    SimDecodingSettings settings;
    settings.technology = "gsm";
    settings.decode = false;
    const std::vector<PlistData> first = runSimDecoding(settings).blobs;
    EXPECT_EQ(first, runSimDecoding(settings).blobs);
    settings.seed = 2;
    EXPECT_NE(first, runSimDecoding(settings).blobs);
}

}  // namespace
}  // namespace velmar::testing
