#include <gtest/gtest.h>

#include "LogGenerator/GSM/GSMServingCell.h"
#include "LogGenerator/GSM/MobileAllocation.h"
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
using testing::LogCapture;
using testing::rowOf;
using testing::textOf;

const std::string kGsm(kKxCellMonitorRadioAccessTechnologyGSM);
const std::string kUmts(kKxCellMonitorRadioAccessTechnologyUMTS);
const std::string kServing(kKxCellMonitorCellTypeServing);
const std::string kNeighbor(kKxCellMonitorCellTypeNeighbor);

TEST(GSMServingCell, IdentityRecordWritesCellIdArfcnAndBsicInOrder) {
    KeySectionHarness<GSMServingCell> serving;
    LogCapture capture;
    // ARFCN 0x03FD = 1021, BSIC 0x0035 = 53, cell id 0xBEEF = 48879.
    serving.feed(buildGsmServingIdentityRecord({.arfcn = 0x03FD, .bsic = 0x0035, .cellId = 0xBEEF}), 0x5134);
    EXPECT_EQ(PlistValue(serving.section), rowOf({{"Cell ID", "48879"}, {"ARFCN", "1021"}, {"BSIC", "53"}}));
    EXPECT_EQ(capture.lines(), (std::vector<LogCapture::Line>{{kLogWarning, "GSMServingCell"}}));
}

TEST(GSMServingCell, IdentityRecordOfTwentyFiveBytesIsIgnored) {
    KeySectionHarness<GSMServingCell> serving;
    serving.feed(buildGsmServingIdentityRecord({.arfcn = 7, .bsic = 8, .cellId = 9, .length = 25}), 0x5134);
    EXPECT_TRUE(serving.section->empty());
    serving.feed(buildGsmServingIdentityRecord({.arfcn = 7, .bsic = 8, .cellId = 9, .length = 26}), 0x5134);
    EXPECT_EQ(PlistValue(serving.section), rowOf({{"Cell ID", "9"}, {"ARFCN", "7"}, {"BSIC", "8"}}));
}

TEST(GSMServingCell, MeasurementsShowTheRawLevelAndTheLow16BitsOfC1AndC2) {
    KeySectionHarness<GSMServingCell> serving;
    // C1 0x0001FFFE keeps 0xFFFE = 65534; C2 0xABCD0012 keeps 0x0012 = 18; the level byte 95 is shown as is.
    serving.feed(buildGsmMeasurementRecord({.rxLevel = 95, .c1 = 0x0001FFFE, .c2 = 0xABCD0012}), 0x5137);
    EXPECT_EQ(PlistValue(serving.section),
              rowOf({{"RSSI", "95 dBm"}, {"C1 Value", "65534"}, {"C2 Value", "18"}}));
}

TEST(GSMServingCell, DedicatedArfcnShowsOnlyItsLowByte) {
    KeySectionHarness<GSMServingCell> serving;
    serving.feed(buildGsmDedicatedChannelRecord({.arfcn = 0x0201}), 0x5076);
    EXPECT_EQ(textOf(*serving.section, "MA Dedicated ARFCN"), "1");
    serving.feed(buildGsmDedicatedChannelRecord({.arfcn = 0x03FF}), 0x5076);
    EXPECT_EQ(textOf(*serving.section, "MA Dedicated ARFCN"), "255");
    serving.feed(buildGsmDedicatedChannelRecord({.arfcn = 0x0107, .length = 16}), 0x5076);
    EXPECT_EQ(textOf(*serving.section, "MA Dedicated ARFCN"), "255");
}

TEST(GSMServingCell, UnknownCodeIsLoggedAndIgnored) {
    KeySectionHarness<GSMServingCell> serving;
    LogCapture capture;
    serving.feed(buildGsmServingIdentityRecord({.arfcn = 1}), 0x5135);
    EXPECT_TRUE(serving.section->empty());
    EXPECT_EQ(capture.lines(),
              (std::vector<LogCapture::Line>{{kLogWarning, "GSMServingCell"},
                                             {kLogError, "Received an unknown log message: 20789"}}));
}

TEST(GSMServingCell, CellMonitorTakesTheFirstGsmServingCell) {
    KeySectionHarness<GSMServingCell> serving;
    LogCapture capture;
    serving.feed(buildCellMonitorEntries({
                     {.technology = kUmts, .cellType = kServing, .cellId = 1, .arfcn = 2},
                     {.technology = kGsm, .cellType = kNeighbor, .cellId = 3, .arfcn = 4},
                     {.technology = kGsm, .cellId = 5, .arfcn = 6},    // no cell type: skipped
                     {.cellType = kServing, .cellId = 7, .arfcn = 8},  // no technology: skipped
                     {.technology = kGsm, .cellType = kServing, .cellId = 4242, .arfcn = 77},
                     {.technology = kGsm, .cellType = kServing, .cellId = 9, .arfcn = 10},
                 }),
                 0xFF0001);
    EXPECT_EQ(PlistValue(serving.section), rowOf({{"Cell ID", "4242"}, {"ARFCN", "77"}}));
    EXPECT_EQ(capture.lines(), (std::vector<LogCapture::Line>{{kLogWarning, "GSMServingCell"}}));
}

TEST(GSMServingCell, CellMonitorWithoutGsmServingCellLeavesTheSectionUntouched) {
    KeySectionHarness<GSMServingCell> serving;
    serving.section->set("Cell ID", "11");
    LogCapture capture;
    serving.feed(buildCellMonitorEntries({{.technology = kUmts, .cellType = kServing, .cellId = 1},
                                          {.technology = kGsm, .cellType = kNeighbor, .arfcn = 4}}),
                 0xFF0001);
    serving.feed(buildCellMonitorEntries({}), 0xFF0001);
    EXPECT_EQ(PlistValue(serving.section), rowOf({{"Cell ID", "11"}}));
    EXPECT_EQ(capture.textsAt(kLogError), std::vector<std::string>{});
}

TEST(GSMServingCell, MissingOrMistypedCellIdDoesNotStopTheArfcn) {
    KeySectionHarness<GSMServingCell> serving;
    serving.section->set("Cell ID", "11");
    LogCapture capture;
    auto cell = cellMonitorEntryDictionary({.technology = kGsm, .cellType = kServing, .arfcn = 512});
    cell.dictionary()->set(kKxCellMonitorCellId, "1234");  // a string, not a number
    auto cells = PlistArray::create();
    cells->append(cell);
    serving.feed(buildCellMonitorPacket(cells), 0xFF0001);
    EXPECT_EQ(PlistValue(serving.section), rowOf({{"Cell ID", "11"}, {"ARFCN", "512"}}));
    EXPECT_EQ(capture.textsAt(kLogError),
              std::vector<std::string>{"GSMServingCell: Failed to retrieve Cell ID\n"});

    capture.clear();
    serving.feed(buildCellMonitorEntries({{.technology = kGsm, .cellType = kServing}}), 0xFF0001);
    EXPECT_EQ(capture.textsAt(kLogError),
              (std::vector<std::string>{"GSMServingCell: Failed to retrieve Cell ID\n",
                                        "GSMServingCell: Failed to retrieve ARFCN\n"}));
    EXPECT_EQ(PlistValue(serving.section), rowOf({{"Cell ID", "11"}, {"ARFCN", "512"}}));
}

TEST(GSMServingCell, CellMonitorNumbersMayBeReals) {
    KeySectionHarness<GSMServingCell> serving;
    auto cell = cellMonitorEntryDictionary({.technology = kGsm, .cellType = kServing});
    cell.dictionary()->set(kKxCellMonitorCellId, PlistValue::real(-17.9));
    cell.dictionary()->set(kKxCellMonitorARFCN, PlistValue::real(60.5));
    auto cells = PlistArray::create();
    cells->append(cell);
    serving.feed(buildCellMonitorPacket(cells), 0xFF0001);
    EXPECT_EQ(PlistValue(serving.section), rowOf({{"Cell ID", "-17"}, {"ARFCN", "60"}}));
}

TEST(GSMServingCell, UnparsableCellMonitorRecordIsLogged) {
    KeySectionHarness<GSMServingCell> serving;
    serving.section->set("ARFCN", "3");
    LogCapture capture;
    const std::uint8_t garbage[] = {'n', 'o', 't', ' ', 'a', ' ', 'p', 'l', 'i', 's', 't'};
    serving.feed(buildExtendedPacket(0x0001, garbage), 0xFF0001);
    EXPECT_EQ(capture.lines(),
              (std::vector<LogCapture::Line>{{kLogWarning, "GSMServingCell"},
                                             {kLogError, "Cell Info Array data could not be constructed"},
                                             {kLogError, "Failed to get Cell Array\n"}}));
    EXPECT_EQ(PlistValue(serving.section), rowOf({{"ARFCN", "3"}}));
}

TEST(GSMServingCell, UnboundDecoderStillLogs) {
    GSMServingCell serving;
    LogCapture capture;
    serving.updateWithData(buildCellMonitorEntries({{.technology = kGsm, .cellType = kServing}}), 0xFF0001);
    serving.updateWithData(buildGsmServingIdentityRecord({.arfcn = 1}), 0x5134);
    EXPECT_EQ(capture.texts(),
              (std::vector<std::string>{"GSMServingCell", "GSMServingCell: Failed to retrieve Cell ID\n",
                                        "GSMServingCell: Failed to retrieve ARFCN\n", "GSMServingCell"}));
}

TEST(MobileAllocation, HsnAndAnArrayOfArfcnStrings) {
    KeySectionHarness<MobileAllocation> allocation;
    LogCapture capture;
    allocation.feed(buildMobileAllocationRecord({.hsn = 63, .arfcns = {1, 0x0203, 1023}}), 0x51F8);
    auto arfcns = PlistArray::create();
    for (const char* arfcn : {"1", "515", "1023"}) {
        arfcns->append(arfcn);
    }
    auto expected = PlistDictionary::create();
    expected->set("HSN", "63");
    expected->set("ARFCNs", arfcns);
    EXPECT_EQ(PlistValue(allocation.section), PlistValue(expected));
    EXPECT_TRUE(allocation.section->get("ARFCNs").isArray());
    EXPECT_EQ(capture.lines(), (std::vector<LogCapture::Line>{{kLogWarning, "MobileAllocation"}}));
}

TEST(MobileAllocation, CountZeroStoresAnEmptyArray) {
    KeySectionHarness<MobileAllocation> allocation;
    allocation.feed(buildMobileAllocationRecord({.hsn = 2, .arfcns = {5}}), 0x51F8);
    allocation.feed(buildMobileAllocationRecord({.hsn = 0}), 0x51F8);
    EXPECT_EQ(textOf(*allocation.section, "HSN"), "0");
    ASSERT_TRUE(allocation.section->get("ARFCNs").isArray());
    EXPECT_TRUE(allocation.section->get("ARFCNs").array()->empty());
}

TEST(MobileAllocation, FourteenBytesChangeNothingAndFifteenDo) {
    KeySectionHarness<MobileAllocation> allocation;
    allocation.feed(buildMobileAllocationRecord({.hsn = 9, .length = 14}), 0x51F8);
    EXPECT_TRUE(allocation.section->empty());
    allocation.feed(buildMobileAllocationRecord({.hsn = 9, .length = 15}), 0x51F8);
    EXPECT_EQ(textOf(*allocation.section, "HSN"), "9");
}

TEST(MobileAllocation, CountPastTheEndReadsMissingArfcnsAsZero) {
    KeySectionHarness<MobileAllocation> allocation;
    // Count 4 but only one ARFCN (and one stray byte, 0x12) in the record.
    allocation.feed(
        buildMobileAllocationRecord({.hsn = 1, .arfcns = {0x1234}, .countOverride = 4, .length = 18}),
        0x51F8);
    auto arfcns = PlistArray::create();
    for (const char* arfcn : {"4660", "0", "0", "0"}) {
        arfcns->append(arfcn);
    }
    EXPECT_EQ(allocation.section->get("ARFCNs"), PlistValue(arfcns));
    allocation.feed(
        buildMobileAllocationRecord({.hsn = 1, .arfcns = {0x1234}, .countOverride = 2, .length = 16}),
        0x51F8);
    auto cut = PlistArray::create();
    cut->append("52");  // only the low byte 0x34 of the ARFCN is in the record
    cut->append("0");
    EXPECT_EQ(allocation.section->get("ARFCNs"), PlistValue(cut));
}

TEST(MobileAllocation, UnknownCodeIsLogged) {
    KeySectionHarness<MobileAllocation> allocation;
    LogCapture capture;
    allocation.feed(buildMobileAllocationRecord({.hsn = 1}), 0x51F7);
    EXPECT_EQ(capture.texts(),
              (std::vector<std::string>{"MobileAllocation", "Received an unknown log message: 20983"}));
    EXPECT_TRUE(allocation.section->empty());
}

}  // namespace
}  // namespace velmar
