#include <gtest/gtest.h>

#include "LogGenerator/GSM/ActiveSet.h"
#include "LogGenerator/GSM/ArrayOutOfBoundsException.h"
#include "LogGenerator/GSM/CellSetRecord.h"
#include "LogGenerator/GSM/CountedList.h"
#include "LogGenerator/GSM/DetectedSet.h"
#include "LogGenerator/GSM/MonitoredSet.h"
#include "LogGenerator/GSM/ORV_GSMLogGenerator.h"
#include "LogGenerator/GSM/UMTSSet.h"
#include "LogGenerator/GSM/VirtualActiveSet.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/SystemLog.h"
#include "logfile/records/GsmRecords.h"
#include "logfile/records/RecordBuilder.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"

// Records and cells are written with designated initializers; the fields left out keep their defaults.
#pragma GCC diagnostic ignored "-Wmissing-field-initializers"

namespace velmar {
namespace {

using testing::ListSectionHarness;
using testing::LogCapture;
using testing::rowOf;
using testing::rowsOf;

const std::string kGsm(kKxCellMonitorRadioAccessTechnologyGSM);
const std::string kUmts(kKxCellMonitorRadioAccessTechnologyUMTS);
const std::string kServing(kKxCellMonitorCellTypeServing);
const std::string kNeighbor(kKxCellMonitorCellTypeNeighbor);

TEST(UmtsCellSets, ActiveCellsBecomeRowsAndTheOtherSetsStayEmpty) {
    testing::GeneratorHarness<ORV_GSMLogGenerator> harness;
    harness.feed(RecordBuilder(0x1234).build());
    for (const char* name : {"Detected Set", "Monitored Set", "Virtual Active Set"}) {
        harness.listSection(name)->append(rowOf({{"Scrambling Code", "old"}}));
    }
    // P = -1000: trunc(-488 / 10) = -48, so RSCP = -48 - 106 + E.
    // Cell 0: readings 0, 0, 5000 use 5000; 5000 >= 4462 gives E = -21, RSCP = -175.
    // Cell 1: set type 1, no row. Cell 2: readings 7, 0, 5000 use 7; 7 <= 705 gives E = 0, RSCP = -154.
    harness.feed(buildUmtsCellSetRecord(
        {.powerReading = -1000,
         .cells = {{.scramblingCode = 308, .setType = 0, .energyReadings = {0, 0, 5000}},
                   {.scramblingCode = 17, .setType = 1, .energyReadings = {1, 1, 1}},
                   {.scramblingCode = 8191, .setType = 0, .energyReadings = {7, 0, 5000}}}}));
    EXPECT_EQ(PlistValue(harness.listSection("Active Set")),
              rowsOf({
                  {{"Scrambling Code", "308"}, {"RSCP", "-175 dB"}, {"Energy Per Chip", "-21 dB"}},
                  {{"Scrambling Code", "8191"}, {"RSCP", "-154 dB"}, {"Energy Per Chip", "0 dB"}},
              }));
    for (const char* name : {"Detected Set", "Monitored Set", "Virtual Active Set"}) {
        EXPECT_TRUE(harness.listSection(name)->empty()) << name;
    }
}

TEST(UmtsCellSets, ScramblingCodeAndSetTypeShareByte8) {
    ListSectionHarness<ActiveSet> active;
    // Cell entry bytes 7 = 0x34, 8 = 0x21: code ((0x21 & 0x1F) << 8) | 0x34 = 0x134 = 308, set type 1.
    PlistData record =
        RecordBuilder(0x417A).u8(15, 1).u8(16 + 7, 0x34).u8(16 + 8, 0x21).resize(16 + 15 + 44).build();
    active.feed(record, 0x417A);
    EXPECT_TRUE(active.section->empty());
    record[16 + 8] = 0x01;
    active.feed(record, 0x417A);
    // P = 0: trunc(512 / 10) = 51, 51 - 106 + 0 = -55.
    EXPECT_EQ(active.rows(),
              rowsOf({{{"Scrambling Code", "308"}, {"RSCP", "-55 dB"}, {"Energy Per Chip", "0 dB"}}}));
}

TEST(UmtsCellSets, RscpWithMinus1000AndMinus5) {
    ListSectionHarness<ActiveSet> active;
    // 200000 lies in (166441, 209463]: E = -5; -48 - 106 - 5 = -159.
    active.feed(buildUmtsCellSetRecord({.powerReading = -1000,
                                        .cells = {{.scramblingCode = 1, .energyReadings = {200000, 9, 9}}}}),
                0x417A);
    EXPECT_EQ(active.rows(),
              rowsOf({{{"Scrambling Code", "1"}, {"RSCP", "-159 dB"}, {"Energy Per Chip", "-5 dB"}}}));
}

TEST(UmtsCellSets, AllThreeReadingsZeroPassZero) {
    ListSectionHarness<ActiveSet> active;
    // P = 25: trunc(537 / 10) = 53; 53 - 106 + 0 = -53.
    active.feed(buildUmtsCellSetRecord(
                    {.powerReading = 25, .cells = {{.scramblingCode = 2, .energyReadings = {0, 0, 0}}}}),
                0x417A);
    EXPECT_EQ(active.rows(),
              rowsOf({{{"Scrambling Code", "2"}, {"RSCP", "-53 dB"}, {"Energy Per Chip", "0 dB"}}}));
    // Only the third reading: 524288 is 0 dB; P = -519: trunc(-7 / 10) = 0, toward zero; 0 - 106 = -106.
    active.feed(buildUmtsCellSetRecord({.powerReading = -519,
                                        .cells = {{.scramblingCode = 3, .energyReadings = {0, 0, 524288}}}}),
                0x417A);
    EXPECT_EQ(active.rows(),
              rowsOf({{{"Scrambling Code", "3"}, {"RSCP", "-106 dB"}, {"Energy Per Chip", "0 dB"}}}));
}

TEST(UmtsCellSets, ShortRecordIsIgnoredAndCountZeroEmpties) {
    ListSectionHarness<ActiveSet> active;
    ListSectionHarness<DetectedSet> detected;
    active.section->append(rowOf({{"Scrambling Code", "old"}}));
    detected.section->append(rowOf({{"Scrambling Code", "old"}}));
    const PlistData fifteen = buildUmtsCellSetRecord({.length = 15});
    active.feed(fifteen, 0x417A);
    detected.feed(fifteen, 0x417A);
    EXPECT_EQ(active.section->size(), 1u);
    EXPECT_EQ(detected.section->size(), 1u);
    const PlistData sixteen = buildUmtsCellSetRecord({});
    ASSERT_EQ(sixteen.size(), 16u);
    active.feed(sixteen, 0x417A);
    detected.feed(sixteen, 0x417A);
    EXPECT_TRUE(active.section->empty());
    EXPECT_TRUE(detected.section->empty());
}

TEST(UmtsCellSets, CountPastTheEndReadsZeroCells) {
    ListSectionHarness<ActiveSet> active;
    // N = 2 in a 16-byte record: both cells and their energies read as zeros, so both are active-set cells.
    active.feed(buildUmtsCellSetRecord({.countOverride = 2}), 0x417A);
    EXPECT_EQ(active.rows(), rowsOf({
                                 {{"Scrambling Code", "0"}, {"RSCP", "-55 dB"}, {"Energy Per Chip", "0 dB"}},
                                 {{"Scrambling Code", "0"}, {"RSCP", "-55 dB"}, {"Energy Per Chip", "0 dB"}},
                             }));
    // N = 255 with a record of 16 bytes.
    active.feed(buildUmtsCellSetRecord({.countOverride = 255}), 0x417A);
    EXPECT_EQ(active.section->size(), 255u);
}

TEST(UmtsCellSets, EntryLinesAndUnknownCodes) {
    ListSectionHarness<ActiveSet> active;
    ListSectionHarness<DetectedSet> detected;
    ListSectionHarness<MonitoredSet> monitored;
    ListSectionHarness<VirtualActiveSet> virtualActive;
    LogCapture capture;
    const PlistData record = buildUmtsCellSetRecord({});
    active.feed(record, 0x417B);
    detected.feed(record, 0x417B);
    monitored.feed(record, 0x417B);
    virtualActive.feed(record, 0x417B);
    const std::string unknown = "Received an unknown log message: 16763";
    EXPECT_EQ(capture.lines(), (std::vector<LogCapture::Line>{
                                   {kLogWarning, "ActiveSet"},
                                   {kLogError, unknown},
                                   {kLogWarning, "DetectedSet"},
                                   {kLogError, unknown},
                                   {kLogWarning, "MonitoredSet"},
                                   {kLogError, unknown},
                                   {kLogWarning, "VirtualActiveSet"},
                                   {kLogError, unknown},
                               }));
    EXPECT_EQ(active.decoder->getSectionName(), "Active Set");
    EXPECT_EQ(detected.decoder->getSectionName(), "Detected Set");
    EXPECT_EQ(monitored.decoder->getSectionName(), "Monitored Set");
    EXPECT_EQ(virtualActive.decoder->getSectionName(), "Virtual Active Set");
    EXPECT_EQ(active.decoder->getLogCodeArray(), (LogCodeArray{{0x417A}}));
}

TEST(UmtsCellSets, ListAccessorsThrowAtTheCount) {
    const PlistData record = buildUmtsCellSetRecord({.cells = {{.scramblingCode = 5, .setType = 2}}});
    const CellSetRecord cellSets(record);
    EXPECT_EQ(cellSets.cellCount(), 1u);
    EXPECT_EQ(cellSets.cell(0).scramblingCode, 5u);
    EXPECT_EQ(cellSets.cell(0).setType, 2u);
    EXPECT_THROW(cellSets.cell(1), ArrayOutOfBoundsException);
    EXPECT_THROW(cellSets.energyReading(1), ArrayOutOfBoundsException);
    const CountedList list{15, 7, 3};
    EXPECT_EQ(list.elementOffset(2), 29u);
    EXPECT_THROW(list.elementOffset(3), ArrayOutOfBoundsException);
    static_assert(std::is_base_of_v<std::exception, ArrayOutOfBoundsException>);
}

TEST(UMTSSet, RowsFromTheUmtsEntriesInTheirKeyOrder) {
    ListSectionHarness<UMTSSet> umtsSet;
    LogCapture capture;
    umtsSet.feed(buildUmtsSetRecord({.cells = {{.downlinkFrequency = 10737,
                                                .scramblingCode = 300,
                                                .rscpRaw = -64,
                                                .rankCellRscp = -90,
                                                .ecioHalfDb = -13,
                                                .rankingValue = 7},
                                               {.downlinkFrequency = -2,
                                                .scramblingCode = 65535,
                                                .rscpRaw = 21,
                                                .rankCellRscp = 32767,
                                                .ecioHalfDb = 3,
                                                .rankingValue = -32768}}}),
                 0x4005);
    EXPECT_EQ(umtsSet.rows(), rowsOf({
                                  {{"Scrambling Code", "300"},
                                   {"RSCP", "-85 dB"},
                                   {"Energy Per Chip", "-6.500000 dB"},
                                   {"Downlink Frequency", "10737"},
                                   {"Ranking Value", "7"},
                                   {"Rank Cell RSCP", "-90 dB"}},
                                  {{"Scrambling Code", "65535"},
                                   {"RSCP", "0 dB"},
                                   {"Energy Per Chip", "1.500000 dB"},
                                   {"Downlink Frequency", "-2"},
                                   {"Ranking Value", "-32768"},
                                   {"Rank Cell RSCP", "32767 dB"}},
                              }));
    EXPECT_EQ(capture.lines(), (std::vector<LogCapture::Line>{{kLogWarning, "UMTSSet"}}));
}

TEST(UMTSSet, ShortRecordIsIgnoredAndCountZeroEmpties) {
    ListSectionHarness<UMTSSet> umtsSet;
    umtsSet.section->append(rowOf({{"UARFCN", "old"}}));
    umtsSet.feed(buildUmtsSetRecord({.cells = {{.scramblingCode = 1}}, .length = 14}), 0x4005);
    EXPECT_EQ(umtsSet.section->size(), 1u);
    umtsSet.feed(buildUmtsSetRecord({.length = 15}), 0x4005);
    EXPECT_TRUE(umtsSet.section->empty());
}

TEST(UMTSSet, CountPastTheEndKeepsItsRows) {
    ListSectionHarness<UMTSSet> umtsSet;
    umtsSet.feed(buildUmtsSetRecord({.countOverride = 2, .length = 15}), 0x4005);
    const testing::Row zeros = {
        {"Scrambling Code", "0"},    {"RSCP", "-21 dB"},     {"Energy Per Chip", "0.000000 dB"},
        {"Downlink Frequency", "0"}, {"Ranking Value", "0"}, {"Rank Cell RSCP", "0 dB"}};
    EXPECT_EQ(umtsSet.rows(), rowsOf({zeros, zeros}));
}

TEST(UMTSSet, CellMonitorUmtsNeighbours) {
    ListSectionHarness<UMTSSet> umtsSet;
    LogCapture capture;
    umtsSet.feed(
        buildCellMonitorEntries({
            {.technology = kUmts, .cellType = kServing, .uarfcn = 1, .psc = 2, .rscp = -3, .ecn0 = -4},
            {.technology = kUmts,
             .cellType = kNeighbor,
             .uarfcn = 10737,
             .psc = 300,
             .rscp = -95,
             .ecn0 = -7},
            {.technology = kGsm, .cellType = kNeighbor, .arfcn = 5, .rssi = -40},
            {.technology = kUmts,
             .cellType = kNeighbor,
             .uarfcn = 10762,
             .psc = 12,
             .rscp = 32767,
             .ecn0 = 32767},
        }),
        0xFF0001);
    EXPECT_EQ(umtsSet.rows(),
              rowsOf({
                  {{"UARFCN", "10737"},
                   {"Scrambling Code", "300"},
                   {"RSCP", "-95 dBm"},
                   {"Energy Per Chip", "-7 dB"}},
                  {{"UARFCN", "10762"}, {"Scrambling Code", "12"}, {"RSCP", ""}, {"Energy Per Chip", ""}},
              }));
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
}

TEST(UMTSSet, CellMonitorFailuresLeaveKeysOut) {
    ListSectionHarness<UMTSSet> umtsSet;
    auto cells = PlistArray::create();
    PlistValue first =
        cellMonitorEntryDictionary({.technology = kUmts, .cellType = kNeighbor, .rscp = -100, .ecn0 = -12});
    first.dictionary()->set(kKxCellMonitorPSC, PlistValue::boolean(true));
    cells->append(first);
    cells->append(cellMonitorEntryDictionary({.technology = kUmts, .cellType = kNeighbor}));
    LogCapture capture;
    umtsSet.feed(buildCellMonitorPacket(cells), 0xFF0001);
    EXPECT_EQ(umtsSet.rows(), rowsOf({{{"RSCP", "-100 dBm"}, {"Energy Per Chip", "-12 dB"}}, {}}));
    EXPECT_EQ(capture.textsAt(kLogError), (std::vector<std::string>{
                                              "UMTSSet: Failed to retrieve UARFCN\n",
                                              "UMTSSet: Failed to retrieve Scrambling Code\n",
                                              "UMTSSet: Failed to retrieve UARFCN\n",
                                              "UMTSSet: Failed to retrieve Scrambling Code\n",
                                              "UMTSSet: Failed to retrieve RSCP\n",
                                              "UMTSSet: Failed to retrieve Energy Per Chip\n",
                                          }));
}

TEST(UMTSSet, UnparsableCellMonitorEmptiesTheSection) {
    ListSectionHarness<UMTSSet> umtsSet;
    umtsSet.section->append(rowOf({{"UARFCN", "old"}}));
    LogCapture capture;
    const std::uint8_t truncated[] = {'b', 'p', 'l', 'i', 's', 't', '0', '0', 0xD1};
    umtsSet.feed(buildExtendedPacket(0x0001, truncated), 0xFF0001);
    EXPECT_TRUE(umtsSet.section->empty());
    EXPECT_EQ(capture.texts(),
              (std::vector<std::string>{"UMTSSet", "Cell Info Array data could not be constructed",
                                        "Failed to get Cell Array\n"}));
}

TEST(UMTSSet, UnknownCodeIsLogged) {
    ListSectionHarness<UMTSSet> umtsSet;
    LogCapture capture;
    umtsSet.feed(buildUmtsSetRecord({}), 0xFF0003);
    EXPECT_EQ(capture.texts(),
              (std::vector<std::string>{"UMTSSet", "Received an unknown log message: 16711683"}));
}

}  // namespace
}  // namespace velmar
