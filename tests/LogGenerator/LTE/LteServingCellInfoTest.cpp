#include <gtest/gtest.h>

#include "LogGenerator/LTE/LTEServingCellInfo.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/SystemLog.h"
#include "logfile/records/LteRecords.h"
#include "logfile/records/RecordBuilder.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::KeySectionHarness;
using testing::packetWithPayload;
using testing::zeroPacket;

constexpr std::int32_t kServingCellInfo = 0xB0C2;
constexpr std::int32_t kMasterInformation = 0xB0C1;
constexpr std::int32_t kCellMonitor = 0xFF0001;

// 0xB0C2 written out byte by byte: version 9, PCI 377, DL EARFCN 2850, UL EARFCN 20850, bandwidths 50 and 25
// resource blocks, cell identity 0x01A2B3C4, TAC 12345, band 7, six trailing bytes up to the 38-byte minimum.
std::vector<std::uint8_t> handWrittenServingCellInfo() {
    return packetWithPayload(kServingCellInfo,
                             {0x09, 0x79, 0x01, 0x22, 0x0B, 0x72, 0x51, 0x32, 0x19, 0xC4, 0xB3, 0xA2, 0x01,
                              0x39, 0x30, 0x07, 0x00, 0x00, 0x00, 0,    0,    0,    0,    0,    0});
}

LteCellMonitorCell servingLteCell() {
    LteCellMonitorCell cell;
    cell.technology = std::string(kKxCellMonitorRadioAccessTechnologyLTE);
    cell.cellType = std::string(kKxCellMonitorCellTypeServing);
    cell.trackingAreaCode = 4660;
    cell.cellId = 27440069;
    cell.physicalCellId = 99;
    cell.bandInfo = 3;
    cell.uarfcn = 1300;
    return cell;
}

TEST(LteServingCellInfo, SectionAndCodes) {
    LTEServingCellInfo decoder;
    EXPECT_EQ(decoder.getSectionName(), "Serving Cell Info");
    EXPECT_EQ(decoder.getLogCodeArray(), (LogCodeArray{std::vector<std::int32_t>{0xB0C2, 0xB0C1, 0xFF0001}}));
}

TEST(LteServingCellInfo, ServingCellRecordWritesEveryKeyInOrder) {
    KeySectionHarness<LTEServingCellInfo> bound;
    const auto packet = handWrittenServingCellInfo();
    ASSERT_EQ(packet.size(), 38u);
    testing::LogCapture capture;
    bound.feed(packet, kServingCellInfo);
    EXPECT_EQ(testing::keysOf(*bound.section),
              (std::vector<std::string>{"Physical Cell ID", "Download Frequency", "Upload Frequency",
                                        "Download Bandwidth", "Upload Bandwidth", "Cell Identity",
                                        "Tracking Area Code", "Freq Band Indicator"}));
    EXPECT_EQ(bound.text("Physical Cell ID"), "377");
    EXPECT_EQ(bound.text("Download Frequency"), "2850");
    EXPECT_EQ(bound.text("Upload Frequency"), "20850");
    EXPECT_EQ(bound.text("Download Bandwidth"), "10 MHz");
    EXPECT_EQ(bound.text("Upload Bandwidth"), "5 MHz");
    EXPECT_EQ(bound.text("Cell Identity"), "27440068");
    EXPECT_EQ(bound.text("Tracking Area Code"), "12345");
    EXPECT_EQ(bound.text("Freq Band Indicator"), "7");
    EXPECT_EQ(capture.lines(),
              (std::vector<testing::LogCapture::Line>{{kLogWarning, "LTE Serving Cell Info"}}));
}

TEST(LteServingCellInfo, BandwidthNamesAndUnknown) {
    KeySectionHarness<LTEServingCellInfo> bound;
    const struct {
        std::uint8_t blocks;
        const char* name;
    } cases[] = {{6, "1.4 MHz"},  {15, "3 MHz"},  {25, "5 MHz"},  {50, "10 MHz"},  {75, "15 MHz"},
                 {100, "20 MHz"}, {7, "Unknown"}, {0, "Unknown"}, {255, "Unknown"}};
    for (const auto& item : cases) {
        LteServingCellInfoRecord record;
        record.downlinkBandwidth = item.blocks;
        record.uplinkBandwidth = item.blocks;
        bound.feed(buildLteServingCellInfoRecord(record), kServingCellInfo);
        EXPECT_EQ(bound.text("Download Bandwidth"), item.name) << int(item.blocks);
        EXPECT_EQ(bound.text("Upload Bandwidth"), item.name) << int(item.blocks);
    }
    LteServingCellInfoRecord record;
    record.downlinkBandwidth = 6;
    record.uplinkBandwidth = 100;
    bound.feed(buildLteServingCellInfoRecord(record), kServingCellInfo);
    EXPECT_EQ(bound.text("Download Bandwidth"), "1.4 MHz");
    EXPECT_EQ(bound.text("Upload Bandwidth"), "20 MHz");
}

TEST(LteServingCellInfo, ThirtyTwoBitFieldsShowNegativeFromTwoToTheThirtyFirst) {
    KeySectionHarness<LTEServingCellInfo> bound;
    LteServingCellInfoRecord record;
    record.cellIdentity = 0x80000000u;
    record.frequencyBandIndicator = 0xFFFFFFFEu;
    bound.feed(buildLteServingCellInfoRecord(record), kServingCellInfo);
    EXPECT_EQ(bound.text("Cell Identity"), "-2147483648");
    EXPECT_EQ(bound.text("Freq Band Indicator"), "-2");
}

TEST(LteServingCellInfo, ThirtySevenByteRecordChangesNothing) {
    KeySectionHarness<LTEServingCellInfo> bound;
    bound.section->set("Physical Cell ID", "old");
    auto packet = handWrittenServingCellInfo();
    packet.pop_back();
    testing::LogCapture capture;
    bound.feed(packet, kServingCellInfo);
    EXPECT_EQ(testing::keysOf(*bound.section), std::vector<std::string>{"Physical Cell ID"});
    EXPECT_EQ(bound.text("Physical Cell ID"), "old");
    EXPECT_EQ(capture.texts(), std::vector<std::string>{"LTE Serving Cell Info"});
}

TEST(LteServingCellInfo, MasterInformationStoresAntennasAndStillReportsTheCode) {
    KeySectionHarness<LTEServingCellInfo> bound;
    auto packet = zeroPacket(kMasterInformation, 22);
    packet[20] = 2;
    packet[19] = 7;  // neighbours of the antenna byte must not leak into it
    packet[21] = 9;
    testing::LogCapture capture;
    bound.feed(packet, kMasterInformation);
    EXPECT_EQ(testing::keysOf(*bound.section), std::vector<std::string>{"Num Tx Antennas"});
    EXPECT_EQ(bound.text("Num Tx Antennas"), "2");
    EXPECT_EQ(capture.lines(), (std::vector<testing::LogCapture::Line>{
                                   {kLogWarning, "LTE Serving Cell Info"},
                                   {kLogError, "Received an unknown log message: 45249"}}));
}

TEST(LteServingCellInfo, ShortMasterInformationIsDroppedSilently) {
    KeySectionHarness<LTEServingCellInfo> bound;
    auto packet = zeroPacket(kMasterInformation, 21);
    packet[20] = 4;
    testing::LogCapture capture;
    bound.feed(packet, kMasterInformation);
    EXPECT_TRUE(bound.section->empty());
    EXPECT_TRUE(capture.textsAt(kLogError).empty());

    LteMasterInformationRecord record;
    record.numTxAntennas = 4;
    bound.feed(buildLteMasterInformationRecord(record), kMasterInformation);
    EXPECT_EQ(bound.text("Num Tx Antennas"), "4");
}

TEST(LteServingCellInfo, UnknownCodeIsReportedAndChangesNothing) {
    KeySectionHarness<LTEServingCellInfo> bound;
    testing::LogCapture capture;
    bound.feed(handWrittenServingCellInfo(), 0xB0C3);
    EXPECT_TRUE(bound.section->empty());
    EXPECT_EQ(capture.lines(), (std::vector<testing::LogCapture::Line>{
                                   {kLogWarning, "LTE Serving Cell Info"},
                                   {kLogError, "Received an unknown log message: 45251"}}));
}

TEST(LteServingCellInfo, CellMonitorServingCellWritesItsFiveKeys) {
    KeySectionHarness<LTEServingCellInfo> bound;
    testing::LogCapture capture;
    bound.feed(buildLteCellMonitorRecord({servingLteCell()}), kCellMonitor);
    EXPECT_EQ(testing::keysOf(*bound.section),
              (std::vector<std::string>{"Tracking Area Code", "Cell Identity", "Physical Cell ID",
                                        "Freq Band Indicator", "UARFCN"}));
    EXPECT_EQ(bound.text("Tracking Area Code"), "4660");
    EXPECT_EQ(bound.text("Cell Identity"), "27440069");
    EXPECT_EQ(bound.text("Physical Cell ID"), "99");
    EXPECT_EQ(bound.text("Freq Band Indicator"), "3");
    EXPECT_EQ(bound.text("UARFCN"), "1300");
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
}

TEST(LteServingCellInfo, ServingCellRecordRemovesUarfcnAndTheNextArrayWritesItAgain) {
    KeySectionHarness<LTEServingCellInfo> bound;
    bound.feed(buildLteCellMonitorRecord({servingLteCell()}), kCellMonitor);
    ASSERT_EQ(bound.text("UARFCN"), "1300");
    bound.feed(handWrittenServingCellInfo(), kServingCellInfo);
    EXPECT_EQ(bound.text("UARFCN"), "<missing>");
    EXPECT_EQ(bound.text("Physical Cell ID"), "377");
    EXPECT_EQ(bound.text("Tracking Area Code"), "12345");
    bound.feed(buildLteCellMonitorRecord({servingLteCell()}), kCellMonitor);
    EXPECT_EQ(bound.text("UARFCN"), "1300");
    EXPECT_EQ(bound.text("Physical Cell ID"), "99");
    // Download Frequency only comes from the record and keeps its value.
    EXPECT_EQ(bound.text("Download Frequency"), "2850");
}

TEST(LteServingCellInfo, ArrayWhoseOnlyLteCellIsANeighbourChangesNothingAndLogsNothing) {
    KeySectionHarness<LTEServingCellInfo> bound;
    LteCellMonitorCell neighbour = servingLteCell();
    neighbour.cellType = std::string(kKxCellMonitorCellTypeNeighbor);
    LteCellMonitorCell umtsServing = servingLteCell();
    umtsServing.technology = std::string(kKxCellMonitorRadioAccessTechnologyUMTS);
    testing::LogCapture capture;
    bound.feed(buildLteCellMonitorRecord({neighbour, umtsServing}), kCellMonitor);
    EXPECT_TRUE(bound.section->empty());
    EXPECT_EQ(capture.texts(), std::vector<std::string>{"LTE Serving Cell Info"});
}

TEST(LteServingCellInfo, ServingCellWithoutTacLogsAndStoresTheOtherFour) {
    KeySectionHarness<LTEServingCellInfo> bound;
    bound.section->set("Tracking Area Code", "77");
    LteCellMonitorCell cell = servingLteCell();
    cell.trackingAreaCode.reset();
    testing::LogCapture capture;
    bound.feed(buildLteCellMonitorRecord({cell}), kCellMonitor);
    EXPECT_EQ(capture.textsAt(kLogError),
              std::vector<std::string>{"Serving Cell Info: Failed to retrieve TAC\n"});
    EXPECT_EQ(bound.text("Tracking Area Code"), "77");
    EXPECT_EQ(bound.text("Cell Identity"), "27440069");
    EXPECT_EQ(bound.text("Physical Cell ID"), "99");
    EXPECT_EQ(bound.text("Freq Band Indicator"), "3");
    EXPECT_EQ(bound.text("UARFCN"), "1300");
}

TEST(LteServingCellInfo, EveryMissingNumberHasItsMessage) {
    KeySectionHarness<LTEServingCellInfo> bound;
    LteCellMonitorCell cell;
    cell.technology = std::string(kKxCellMonitorRadioAccessTechnologyLTE);
    cell.cellType = std::string(kKxCellMonitorCellTypeServing);
    testing::LogCapture capture;
    bound.feed(buildLteCellMonitorRecord({cell}), kCellMonitor);
    EXPECT_TRUE(bound.section->empty());
    EXPECT_EQ(capture.textsAt(kLogError),
              (std::vector<std::string>{"Serving Cell Info: Failed to retrieve TAC\n",
                                        "Serving Cell Info: Failed to retrieve Cell ID\n",
                                        "Serving Cell Info: Failed to retrieve Physical Cell ID\n",
                                        "Serving Cell Info: Failed to retrieve Freq Band Indicator\n",
                                        "Serving Cell Info: Failed to retrieve UARFCN\n"}));
}

TEST(LteServingCellInfo, TheFirstServingLteCellWinsAndStringNumbersCountAsMissing) {
    KeySectionHarness<LTEServingCellInfo> bound;
    auto cells = PlistArray::create();
    // An entry without the cell-type key is skipped.
    auto untyped = lteCellMonitorDictionary(servingLteCell());
    untyped.dictionary()->remove(kKxCellMonitorCellType);
    untyped.dictionary()->set(kKxCellMonitorPID, PlistValue::integer(1));
    cells->append(untyped);
    auto first = lteCellMonitorDictionary(servingLteCell());
    first.dictionary()->set(kKxCellMonitorPID, PlistValue::real(-12.9));
    first.dictionary()->set(kKxCellMonitorUARFCN, "1300");
    cells->append(first);
    LteCellMonitorCell second = servingLteCell();
    second.physicalCellId = 2;
    second.uarfcn = 5;
    cells->append(lteCellMonitorDictionary(second));
    testing::LogCapture capture;
    bound.feed(buildCellMonitorPacket(PlistValue(cells)), kCellMonitor);
    EXPECT_EQ(bound.text("Physical Cell ID"), "-12");
    EXPECT_EQ(bound.text("UARFCN"), "<missing>");
    EXPECT_EQ(capture.textsAt(kLogError),
              std::vector<std::string>{"Serving Cell Info: Failed to retrieve UARFCN\n"});
}

TEST(LteServingCellInfo, UnreadableOrEmptyCellArrays) {
    KeySectionHarness<LTEServingCellInfo> bound;
    {
        testing::LogCapture capture;
        bound.feed(packetWithPayload(0x0001, {'n', 'o', 't', ' ', 'a', ' ', 'p', 'l', 'i', 's', 't'}),
                   kCellMonitor);
        EXPECT_EQ(capture.textsAt(kLogError),
                  (std::vector<std::string>{"Cell Info Array data could not be constructed",
                                            "Failed to get Cell Array\n"}));
    }
    {
        testing::LogCapture capture;
        bound.feed(zeroPacket(0x0001, 13), kCellMonitor);
        EXPECT_EQ(capture.textsAt(kLogError),
                  (std::vector<std::string>{"Cell Info Array data could not be constructed",
                                            "Failed to get Cell Array\n"}));
    }
    {
        testing::LogCapture capture;
        bound.feed(buildLteCellMonitorRecord({}), kCellMonitor);
        EXPECT_TRUE(capture.textsAt(kLogError).empty());
    }
    EXPECT_TRUE(bound.section->empty());
}

TEST(LteServingCellInfo, UnboundDecoderStillLogs) {
    LTEServingCellInfo decoder;
    testing::LogCapture capture;
    auto packet = zeroPacket(kMasterInformation, 22);
    decoder.updateWithData(packet, kMasterInformation);
    decoder.updateWithData(handWrittenServingCellInfo(), kServingCellInfo);
    EXPECT_EQ(capture.texts(),
              (std::vector<std::string>{"LTE Serving Cell Info", "Received an unknown log message: 45249",
                                        "LTE Serving Cell Info"}));
}

}  // namespace
}  // namespace velmar
