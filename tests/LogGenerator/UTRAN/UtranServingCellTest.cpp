#include <gtest/gtest.h>

#include "LogGenerator/UTRAN/RRC_State.h"
#include "LogGenerator/UTRAN/UTRANServingCellInfo.h"
#include "core/platform/KxServerProtocol.h"
#include "core/platform/SystemLog.h"
#include "logfile/records/UtranRecords.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::KeySectionHarness;
using testing::packetWithPayload;
using testing::zeroPacket;

constexpr std::int32_t kRrcState = 0xD0E0;
constexpr std::int32_t kServingCell = 0xD0E2;
constexpr std::int32_t kCellMonitor = 0xFF0001;

// 0xD0E2 written out: access restrictions 2 at 14, URA 31 at 15, uplink UARFCN 9612 at 17, downlink 10562 at
// 19, cell id 0x0A1B2C3D at 21, byte 25 = 0x03 (bit 0: emergency calls only; bit 1 is not part of the field).
std::vector<std::uint8_t> handWrittenServingCell() {
    return packetWithPayload(kServingCell,
                             {0x00, 0x02, 0x1F, 0x00, 0x8C, 0x25, 0x42, 0x29, 0x3D, 0x2C, 0x1B, 0x0A, 0x03});
}

UtranCellMonitorCell servingUtranCell() {
    UtranCellMonitorCell cell;
    cell.technology = std::string(kKxCellMonitorRadioAccessTechnologyUTRAN2);
    cell.cellType = std::string(kKxCellMonitorCellTypeServing);
    cell.locationAreaCode = 4321;
    cell.cellId = 65537;
    cell.bandInfo = 34;
    cell.scramblingCode = 88;
    cell.uarfcn = 10700;
    return cell;
}

TEST(UtranRrcState, SectionAndCode) {
    RRC_State decoder;
    EXPECT_EQ(decoder.getSectionName(), "RRC Info");
    EXPECT_EQ(decoder.getLogCodeArray(), (LogCodeArray{std::vector<std::int32_t>{0xD0E0}}));
}

TEST(UtranRrcState, ValidModeIsShownAndLogged) {
    KeySectionHarness<RRC_State> bound;
    testing::LogCapture capture;
    bound.feed(packetWithPayload(kRrcState, {0x01, 0x03}), kRrcState);
    EXPECT_EQ(bound.text("State"), "Cell DCH");
    EXPECT_EQ(capture.lines(),
              (std::vector<testing::LogCapture::Line>{
                  {kLogWarning, "RRC Info"},
                  {kLogWarning, "Display Dict = {\"State\": \"Cell DCH\"}, rrc mode = 3 Cell DCH"}}));
}

TEST(UtranRrcState, EveryModeName) {
    KeySectionHarness<RRC_State> bound;
    const struct {
        std::uint8_t mode;
        const char* name;
    } cases[] = {{0, "Disconnected"},     {1, "Connecting"},        {2, "Cell Fach"},
                 {3, "Cell DCH"},         {4, "Cell PCH"},          {5, "Cell URA PCH"},
                 {6, "Unknown RRC Mode"}, {255, "Unknown RRC Mode"}};
    for (const auto& item : cases) {
        UtranRrcStateRecord record;
        record.modeValid = 1;
        record.mode = item.mode;
        bound.feed(buildUtranRrcStateRecord(record), kRrcState);
        EXPECT_EQ(bound.text("State"), item.name) << int(item.mode);
    }
}

TEST(UtranRrcState, ModeIsUnknownUnlessTheValidByteIsOne) {
    KeySectionHarness<RRC_State> bound;
    testing::LogCapture capture;
    bound.feed(packetWithPayload(kRrcState, {0x00, 0x03}), kRrcState);
    EXPECT_EQ(bound.text("State"), "Unknown RRC Mode");
    bound.feed(packetWithPayload(kRrcState, {0x02, 0x01}), kRrcState);
    EXPECT_EQ(bound.text("State"), "Unknown RRC Mode");
    EXPECT_TRUE(capture.contains(
        "Display Dict = {\"State\": \"Unknown RRC Mode\"}, rrc mode = 255 Unknown RRC Mode"));
}

TEST(UtranRrcState, ShortRecordIsReportedAndStillDecoded) {
    KeySectionHarness<RRC_State> bound;
    bound.section->set("State", "Cell DCH");
    testing::LogCapture capture;
    // 14 bytes: byte 13 says the mode is valid, the mode byte itself is missing and reads as zero.
    bound.feed(packetWithPayload(kRrcState, {0x01}), kRrcState);
    EXPECT_EQ(bound.text("State"), "Disconnected");
    EXPECT_EQ(capture.texts(),
              (std::vector<std::string>{
                  "RRC Info", "LogCode_0xD0E0 is length is 14 expected size 15",
                  "Display Dict = {\"State\": \"Disconnected\"}, rrc mode = 0 Disconnected"}));
    capture.clear();
    bound.feed(zeroPacket(kRrcState, 13), kRrcState);
    EXPECT_EQ(bound.text("State"), "Unknown RRC Mode");
    EXPECT_TRUE(capture.contains("LogCode_0xD0E0 is length is 13 expected size 15"));
}

TEST(UtranRrcState, OtherCodesAreIgnoredSilently) {
    KeySectionHarness<RRC_State> bound;
    testing::LogCapture capture;
    bound.feed(packetWithPayload(kRrcState, {0x01, 0x03}), 0xD0E2);
    EXPECT_TRUE(bound.section->empty());
    EXPECT_EQ(capture.texts(), std::vector<std::string>{"RRC Info"});
}

TEST(UtranServingCell, SectionAndCodes) {
    UTRANServingCellInfo decoder;
    EXPECT_EQ(decoder.getSectionName(), "Serving Cell Info");
    EXPECT_EQ(decoder.getLogCodeArray(), (LogCodeArray{std::vector<std::int32_t>{0xD0E2, 0xFF0001}}));
}

TEST(UtranServingCell, RecordFieldsInOrder) {
    KeySectionHarness<UTRANServingCellInfo> bound;
    const auto packet = handWrittenServingCell();
    ASSERT_EQ(packet.size(), 26u);
    testing::LogCapture capture;
    bound.feed(packet, kServingCell);
    EXPECT_EQ(testing::keysOf(*bound.section),
              (std::vector<std::string>{"Cell Access Restrictions", "Cell ID", "Downlink UARFCN",
                                        "Uplink UARFCN", "URA ID", "Allowed Access"}));
    EXPECT_EQ(bound.text("Cell Access Restrictions"), "2");
    EXPECT_EQ(bound.text("Cell ID"), "169552957");
    EXPECT_EQ(bound.text("Downlink UARFCN"), "10562");
    EXPECT_EQ(bound.text("Uplink UARFCN"), "9612");
    EXPECT_EQ(bound.text("URA ID"), "31");
    EXPECT_EQ(bound.text("Allowed Access"), "Emergency Calls Only");
    EXPECT_EQ(capture.texts(), std::vector<std::string>{"Serving Cell Info"});
}

TEST(UtranServingCell, AllCallsWhenBitZeroIsClear) {
    KeySectionHarness<UTRANServingCellInfo> bound;
    UtranServingCellRecord record;
    record.cellId = 0xFFFFFFFFu;
    bound.feed(buildUtranServingCellRecord(record), kServingCell);
    EXPECT_EQ(bound.text("Allowed Access"), "All Calls");
    EXPECT_EQ(bound.text("Cell ID"), "-1");
    auto packet = handWrittenServingCell();
    packet[25] = 0xFE;
    bound.feed(packet, kServingCell);
    EXPECT_EQ(bound.text("Allowed Access"), "All Calls");
}

TEST(UtranServingCell, TwentyFiveBytesChangeNothingAndOtherCodesAreIgnored) {
    KeySectionHarness<UTRANServingCellInfo> bound;
    auto packet = handWrittenServingCell();
    packet.pop_back();
    testing::LogCapture capture;
    bound.feed(packet, kServingCell);
    bound.feed(handWrittenServingCell(), 0xD0E0);
    EXPECT_TRUE(bound.section->empty());
    EXPECT_EQ(capture.texts(), (std::vector<std::string>{"Serving Cell Info", "Serving Cell Info"}));
}

TEST(UtranServingCell, CellMonitorUarfcnGoesUnderBothKeys) {
    KeySectionHarness<UTRANServingCellInfo> bound;
    testing::LogCapture capture;
    bound.feed(buildUtranCellMonitorRecord({servingUtranCell()}), kCellMonitor);
    EXPECT_EQ(testing::keysOf(*bound.section),
              (std::vector<std::string>{"Local Area Code", "Cell ID", "Freq Band Indicator",
                                        "Cell Scrambling Code", "Uplink UARFCN", "Downlink UARFCN"}));
    EXPECT_EQ(bound.text("Local Area Code"), "4321");
    EXPECT_EQ(bound.text("Cell ID"), "65537");
    EXPECT_EQ(bound.text("Freq Band Indicator"), "34");
    EXPECT_EQ(bound.text("Cell Scrambling Code"), "88");
    EXPECT_EQ(bound.text("Uplink UARFCN"), "10700");
    EXPECT_EQ(bound.text("Downlink UARFCN"), "10700");
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
}

TEST(UtranServingCell, TheLastServingUtranCellWins) {
    KeySectionHarness<UTRANServingCellInfo> bound;
    UtranCellMonitorCell second = servingUtranCell();
    second.cellId = 2;
    second.uarfcn = 9800;
    second.locationAreaCode.reset();
    UtranCellMonitorCell lteServing = servingUtranCell();
    lteServing.technology = std::string(kKxCellMonitorRadioAccessTechnologyLTE);
    lteServing.cellId = 3;
    UtranCellMonitorCell neighbour = servingUtranCell();
    neighbour.cellType = std::string(kKxCellMonitorCellTypeNeighbor);
    neighbour.cellId = 4;
    testing::LogCapture capture;
    bound.feed(buildUtranCellMonitorRecord({servingUtranCell(), second, lteServing, neighbour}),
               kCellMonitor);
    EXPECT_EQ(bound.text("Cell ID"), "2");
    EXPECT_EQ(bound.text("Uplink UARFCN"), "9800");
    EXPECT_EQ(bound.text("Downlink UARFCN"), "9800");
    EXPECT_EQ(bound.text("Local Area Code"), "4321");  // the second cell has none: the first one's stays
    EXPECT_EQ(capture.textsAt(kLogError),
              std::vector<std::string>{"Serving Cell Info: Failed to retrieve LAC\n"});
}

TEST(UtranServingCell, EveryMissingNumberHasItsMessage) {
    KeySectionHarness<UTRANServingCellInfo> bound;
    UtranCellMonitorCell cell;
    cell.technology = std::string(kKxCellMonitorRadioAccessTechnologyUTRAN2);
    cell.cellType = std::string(kKxCellMonitorCellTypeServing);
    testing::LogCapture capture;
    bound.feed(buildUtranCellMonitorRecord({cell}), kCellMonitor);
    EXPECT_TRUE(bound.section->empty());
    EXPECT_EQ(capture.textsAt(kLogError),
              (std::vector<std::string>{"Serving Cell Info: Failed to retrieve LAC\n",
                                        "Serving Cell Info: Failed to retrieve Cell ID\n",
                                        "Serving Cell Info: Failed to retrieve Freq Band Indicator\n",
                                        "Serving Cell Info: Failed to retrieve Cell Scrambling Code\n",
                                        "Serving Cell Info: Failed to retrieve UARFCN\n"}));
}

TEST(UtranServingCell, UnreadableArrayIsLoggedOnceAndEmptyArrayIsSilent) {
    KeySectionHarness<UTRANServingCellInfo> bound;
    {
        testing::LogCapture capture;
        bound.feed(packetWithPayload(0x0001, {'<', 'x'}), kCellMonitor);
        EXPECT_EQ(capture.textsAt(kLogError),
                  std::vector<std::string>{"Cell Info Array data could not be constructed"});
    }
    {
        testing::LogCapture capture;
        bound.feed(buildUtranCellMonitorRecord({}), kCellMonitor);
        EXPECT_TRUE(capture.textsAt(kLogError).empty());
    }
    EXPECT_TRUE(bound.section->empty());
}

}  // namespace
}  // namespace velmar
