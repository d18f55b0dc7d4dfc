#include <gtest/gtest.h>

#include "LogGenerator/GSM/GSMServingCell.h"
#include "LogGenerator/GSM/GSMSet.h"
#include "LogGenerator/GSM/NeighboringCells.h"
#include "LogGenerator/GSM/ORV_GSMLogGenerator.h"
#include "LogGenerator/GSM/UMTSSet.h"
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

using testing::KeySectionHarness;
using testing::ListSectionHarness;
using testing::LogCapture;
using testing::rowOf;
using testing::rowsOf;

const std::string kGsm(kKxCellMonitorRadioAccessTechnologyGSM);
const std::string kUmts(kKxCellMonitorRadioAccessTechnologyUMTS);
const std::string kServing(kKxCellMonitorCellTypeServing);
const std::string kNeighbor(kKxCellMonitorCellTypeNeighbor);

TEST(NeighboringCells, NeighboursTakeTheirBsicFromTheLastBsicList) {
    ListSectionHarness<NeighboringCells> neighbours;
    LogCapture capture;
    // ARFCN 100 is listed twice: the later BSIC, 45, wins.
    neighbours.feed(buildGsmBsicListRecord({.entries = {{100, 23}, {200, 7}, {100, 45}}}), 0x51FF);
    EXPECT_TRUE(neighbours.section->empty());
    neighbours.feed(
        buildGsmMeasurementRecord({.neighbours = {{.arfcn = 100, .rxLevel = 40, .c1 = -5},
                                                  {.arfcn = 300, .rxLevel = 20, .c1 = 70000},
                                                  {.arfcn = 200, .rxLevel = 255, .c1 = 0x7FFFFFFF}}}),
        0x5137);
    EXPECT_EQ(neighbours.rows(),
              rowsOf({
                  {{"ARFCN", "100"}, {"RSSI", "40"}, {"C1 Value", "-5"}, {"BSIC", "45"}},
                  {{"ARFCN", "300"}, {"RSSI", "20"}, {"C1 Value", "70000"}},
                  {{"ARFCN", "200"}, {"RSSI", "255"}, {"C1 Value", "2147483647"}, {"BSIC", "7"}},
              }));
    EXPECT_EQ(capture.texts(), (std::vector<std::string>{"NeighboringCells", "NeighboringCells"}));
}

TEST(NeighboringCells, BsicListWithCountZeroRemovesEveryBsic) {
    ListSectionHarness<NeighboringCells> neighbours;
    neighbours.feed(buildGsmBsicListRecord({.entries = {{100, 23}}}), 0x51FF);
    neighbours.feed(buildGsmBsicListRecord({}), 0x51FF);
    neighbours.feed(buildGsmMeasurementRecord({.neighbours = {{.arfcn = 100, .rxLevel = 1, .c1 = 2}}}),
                    0x5137);
    EXPECT_EQ(neighbours.rows(), rowsOf({{{"ARFCN", "100"}, {"RSSI", "1"}, {"C1 Value", "2"}}}));
}

TEST(NeighboringCells, ShortBsicListLeavesTheOldOne) {
    ListSectionHarness<NeighboringCells> neighbours;
    neighbours.feed(buildGsmBsicListRecord({.entries = {{100, 23}}}), 0x51FF);
    neighbours.feed(buildGsmBsicListRecord({.length = 14}), 0x51FF);
    neighbours.feed(buildGsmMeasurementRecord({.neighbours = {{.arfcn = 100, .rxLevel = 1, .c1 = 2}}}),
                    0x5137);
    EXPECT_EQ(neighbours.rows(),
              rowsOf({{{"ARFCN", "100"}, {"RSSI", "1"}, {"C1 Value", "2"}, {"BSIC", "23"}}}));
}

TEST(NeighboringCells, BsicCountPastTheEndReadsZeros) {
    ListSectionHarness<NeighboringCells> neighbours;
    // Count 3 with one whole entry: the two missing ones read as ARFCN 0 with BSIC 0.
    neighbours.feed(buildGsmBsicListRecord({.entries = {{100, 23}}, .countOverride = 3}), 0x51FF);
    neighbours.feed(buildGsmMeasurementRecord({.neighbours = {{.arfcn = 0, .rxLevel = 1, .c1 = 2}}}), 0x5137);
    EXPECT_EQ(neighbours.rows(), rowsOf({{{"ARFCN", "0"}, {"RSSI", "1"}, {"C1 Value", "2"}, {"BSIC", "0"}}}));
}

TEST(NeighboringCells, MeasurementOf29BytesWithCountZeroEmptiesNeighboursAndUpdatesTheServingCell) {
    testing::GeneratorHarness<ORV_GSMLogGenerator> harness;
    harness.feed(buildGsmMeasurementRecord({.neighbours = {{.arfcn = 1, .rxLevel = 2, .c1 = 3}}}));
    ASSERT_EQ(harness.listSection("Neighboring Cells")->size(), 1u);
    const PlistData record = buildGsmMeasurementRecord({.rxLevel = 61, .c1 = 0x00020010, .c2 = 0x0003FFFF});
    ASSERT_EQ(record.size(), 29u);
    harness.feed(record);
    EXPECT_TRUE(harness.listSection("Neighboring Cells")->empty());
    const PlistDictionaryRef serving = harness.keySection("GSM Serving Cell");
    EXPECT_EQ(testing::textOf(*serving, "RSSI"), "61 dBm");
    EXPECT_EQ(testing::textOf(*serving, "C1 Value"), "16");
    EXPECT_EQ(testing::textOf(*serving, "C2 Value"), "65535");
}

TEST(NeighboringCells, MeasurementOf28BytesChangesNeitherSection) {
    testing::GeneratorHarness<ORV_GSMLogGenerator> harness;
    harness.feed(
        buildGsmMeasurementRecord({.rxLevel = 50, .neighbours = {{.arfcn = 1, .rxLevel = 2, .c1 = 3}}}));
    harness.feed(buildGsmMeasurementRecord({.rxLevel = 61, .c1 = 5, .c2 = 6, .length = 28}));
    EXPECT_EQ(PlistValue(harness.listSection("Neighboring Cells")),
              rowsOf({{{"ARFCN", "1"}, {"RSSI", "2"}, {"C1 Value", "3"}}}));
    EXPECT_EQ(PlistValue(harness.keySection("GSM Serving Cell")),
              rowOf({{"RSSI", "50 dBm"}, {"C1 Value", "0"}, {"C2 Value", "0"}}));
}

TEST(NeighboringCells, NeighbourCountPastTheEndKeepsItsRowsWithZeros) {
    ListSectionHarness<NeighboringCells> neighbours;
    // Count 3 with one neighbour; the record ends 5 bytes into the second element.
    neighbours.feed(buildGsmMeasurementRecord({.neighbours = {{.arfcn = 0x0102, .rxLevel = 3, .c1 = 4}},
                                               .countOverride = 3,
                                               .length = 29 + 14 + 5}),
                    0x5137);
    EXPECT_EQ(neighbours.rows(), rowsOf({
                                     {{"ARFCN", "258"}, {"RSSI", "3"}, {"C1 Value", "4"}},
                                     {{"ARFCN", "0"}, {"RSSI", "0"}, {"C1 Value", "0"}},
                                     {{"ARFCN", "0"}, {"RSSI", "0"}, {"C1 Value", "0"}},
                                 }));
}

TEST(NeighboringCells, UnknownCodeIsLogged) {
    ListSectionHarness<NeighboringCells> neighbours;
    LogCapture capture;
    neighbours.feed(buildGsmBsicListRecord({}), 0x51FE);
    EXPECT_EQ(capture.lines(),
              (std::vector<LogCapture::Line>{{kLogWarning, "NeighboringCells"},
                                             {kLogError, "Received an unknown log message: 20990"}}));
}

TEST(NeighboringCells, CellMonitorNeighboursWithTwiceTheirRssi) {
    ListSectionHarness<NeighboringCells> neighbours;
    neighbours.section->append(rowOf({{"ARFCN", "old"}}));
    LogCapture capture;
    neighbours.feed(buildCellMonitorEntries({
                        {.technology = kGsm, .cellType = kServing, .arfcn = 1, .rssi = -30},
                        {.technology = kGsm, .cellType = kNeighbor, .arfcn = 10, .rssi = -40},
                        {.technology = kUmts, .cellType = kNeighbor, .arfcn = 11, .rssi = -41},
                        {.technology = kGsm, .cellType = kNeighbor, .arfcn = 12, .rssi = 32767},
                        {.technology = kGsm, .arfcn = 13, .rssi = -42},  // no cell type: skipped
                    }),
                    0xFF0001);
    EXPECT_EQ(neighbours.rows(), rowsOf({
                                     {{"ARFCN", "10"}, {"RSSI", "-80 dBm"}},
                                     {{"ARFCN", "12"}, {"RSSI", ""}},
                                 }));
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
}

TEST(NeighboringCells, CellMonitorFailuresLeaveKeysOutButKeepTheRow) {
    ListSectionHarness<NeighboringCells> neighbours;
    auto cells = PlistArray::create();
    cells->append(cellMonitorEntryDictionary({.technology = kGsm, .cellType = kNeighbor, .rssi = -50}));
    PlistValue mistyped = cellMonitorEntryDictionary({.technology = kGsm, .cellType = kNeighbor});
    mistyped.dictionary()->set(kKxCellMonitorARFCN, "x");
    mistyped.dictionary()->set(kKxCellMonitorRSSI, PlistValue::real(-30.7));
    cells->append(mistyped);
    cells->append(cellMonitorEntryDictionary({.technology = kGsm, .cellType = kNeighbor}));
    LogCapture capture;
    neighbours.feed(buildCellMonitorPacket(cells), 0xFF0001);
    EXPECT_EQ(neighbours.rows(), rowsOf({{{"RSSI", "-100 dBm"}}, {{"RSSI", "-60 dBm"}}, {}}));
    EXPECT_EQ(capture.textsAt(kLogError), (std::vector<std::string>{
                                              "NeighboringCells: Failed to retrieve ARFCN\n",
                                              "NeighboringCells: Failed to retrieve ARFCN\n",
                                              "NeighboringCells: Failed to retrieve ARFCN\n",
                                              "NeighboringCells: Failed to retrieve RSSI\n",
                                          }));
}

TEST(NeighboringCells, CellMonitorWithoutGsmNeighbourEmptiesTheList) {
    ListSectionHarness<NeighboringCells> neighbours;
    neighbours.section->append(rowOf({{"ARFCN", "old"}}));
    neighbours.feed(buildCellMonitorEntries({{.technology = kUmts, .cellType = kNeighbor, .uarfcn = 3}}),
                    0xFF0001);
    EXPECT_TRUE(neighbours.section->empty());
}

TEST(NeighboringCells, UnparsableCellMonitorEmptiesTheListAndLogs) {
    ListSectionHarness<NeighboringCells> neighbours;
    neighbours.section->append(rowOf({{"ARFCN", "old"}}));
    LogCapture capture;
    neighbours.feed(RecordBuilder(0x0001, 0, kExtendedLogType).build(), 0xFF0001);
    EXPECT_TRUE(neighbours.section->empty());
    EXPECT_EQ(capture.lines(),
              (std::vector<LogCapture::Line>{{kLogWarning, "NeighboringCells"},
                                             {kLogError, "Cell Info Array data could not be constructed"},
                                             {kLogError, "Failed to get Cell Array\n"}}));
}

TEST(NeighboringCells, CellMonitorRootThatIsNotAnArrayHoldsNothing) {
    ListSectionHarness<NeighboringCells> neighbours;
    neighbours.section->append(rowOf({{"ARFCN", "old"}}));
    LogCapture capture;
    neighbours.feed(
        buildCellMonitorPacket(cellMonitorEntryDictionary({.technology = kGsm, .cellType = kNeighbor})),
        0xFF0001);
    EXPECT_TRUE(neighbours.section->empty());
    EXPECT_EQ(capture.textsAt(kLogError),
              (std::vector<std::string>{"Cell Info Array data could not be constructed",
                                        "Failed to get Cell Array\n"}));
}

TEST(GSMSet, RowsFromTheGsmEntriesOfTheIdleMeasurementRecord) {
    ListSectionHarness<GSMSet> gsmSet;
    LogCapture capture;
    gsmSet.feed(buildGsmSetRecord({.cells = {{.arfcn = 512, .bsic = 0x0107, .rssi = -97, .rankingValue = -12},
                                             {.arfcn = 1, .bsic = 0, .rssi = 127, .rankingValue = 32767}}}),
                0x4005);
    EXPECT_EQ(gsmSet.rows(),
              rowsOf({
                  {{"ARFCN", "512"}, {"BSIC", "263"}, {"RSSI", "-97 dBm"}, {"Ranking Value", "-12"}},
                  {{"ARFCN", "1"}, {"BSIC", "0"}, {"RSSI", "127 dBm"}, {"Ranking Value", "32767"}},
              }));
    EXPECT_EQ(capture.lines(), (std::vector<LogCapture::Line>{{kLogWarning, "GSMSet"}}));
}

TEST(GSMSet, ShortRecordIsIgnoredAndCountZeroEmpties) {
    ListSectionHarness<GSMSet> gsmSet;
    gsmSet.section->append(rowOf({{"ARFCN", "old"}}));
    gsmSet.feed(buildGsmSetRecord({.length = 14}), 0x4005);
    EXPECT_EQ(gsmSet.section->size(), 1u);
    gsmSet.feed(buildGsmSetRecord({.length = 15}), 0x4005);
    EXPECT_TRUE(gsmSet.section->empty());
}

TEST(GSMSet, CountPastTheEndKeepsItsRows) {
    ListSectionHarness<GSMSet> gsmSet;
    gsmSet.feed(buildGsmSetRecord(
                    {.cells = {{.arfcn = 9, .bsic = 8, .rssi = -7, .rankingValue = 6}}, .countOverride = 2}),
                0x4005);
    EXPECT_EQ(gsmSet.rows(), rowsOf({
                                 {{"ARFCN", "9"}, {"BSIC", "8"}, {"RSSI", "-7 dBm"}, {"Ranking Value", "6"}},
                                 {{"ARFCN", "0"}, {"BSIC", "0"}, {"RSSI", "0 dBm"}, {"Ranking Value", "0"}},
                             }));
}

TEST(GSMSet, UnknownCodeIsLogged) {
    ListSectionHarness<GSMSet> gsmSet;
    LogCapture capture;
    gsmSet.feed(buildGsmSetRecord({}), 0x4006);
    EXPECT_EQ(capture.texts(),
              (std::vector<std::string>{"GSMSet", "Received an unknown log message: 16390"}));
}

TEST(GsmAndUmtsSets, BothViewsReadTheirEntriesFromOffset15) {
    testing::GeneratorHarness<ORV_GSMLogGenerator> harness;
    // One record, UMTS count 1 at 13, GSM count 1 at 14, and the ten bytes at 15 read by both views.
    const std::uint8_t entry[] = {0x10, 0x27, 0x39, 0x01, 0xC0, 0xF6, 0xFF, 0xF3, 0x05, 0x00};
    harness.feed(RecordBuilder(0x4005).u8(13, 1).u8(14, 1).bytes(15, entry).build());
    // GSM view: ARFCN 0x2710, BSIC 0x0139, RSSI 0xC0 = -64, ranking 0xFFF6 = -10.
    EXPECT_EQ(PlistValue(harness.listSection("GSM Set")),
              rowsOf({{{"ARFCN", "10000"}, {"BSIC", "313"}, {"RSSI", "-64 dBm"}, {"Ranking Value", "-10"}}}));
    // UMTS view: RSCP -64 - 21 = -85; Ec/Io 0xF3 = -13 half-dB steps = -6.5 dB; ranking 5.
    EXPECT_EQ(PlistValue(harness.listSection("UMTS Set")), rowsOf({{{"Scrambling Code", "313"},
                                                                    {"RSCP", "-85 dB"},
                                                                    {"Energy Per Chip", "-6.500000 dB"},
                                                                    {"Downlink Frequency", "10000"},
                                                                    {"Ranking Value", "5"},
                                                                    {"Rank Cell RSCP", "-10 dB"}}}));
}

}  // namespace
}  // namespace velmar
