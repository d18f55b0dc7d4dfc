#include <gtest/gtest.h>

#include "LogGenerator/LTE/ConnectedModeMeasurementMisc.h"
#include "LogGenerator/LTE/DetectedCells.h"
#include "LogGenerator/LTE/MeasuredNeighborCells.h"
#include "core/platform/SystemLog.h"
#include "logfile/records/LteRecords.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::KeySectionHarness;
using testing::ListSectionHarness;
using testing::packetWithPayload;
using testing::zeroPacket;

constexpr std::int32_t kIntraFrequency = 0xB179;

// 0xB179 written out: version 4, E-ARFCN 1850, serving PCI 291, subframe 4951, serving RSRP raw 400, RSRQ raw
// 86, N = 2, D = 1; neighbours (17, 336, 64) and (402, 1, 160); the detected cell 503 at offset 41.
std::vector<std::uint8_t> handWrittenIntraFrequency() {
    return packetWithPayload(kIntraFrequency, {0x04, 0x00, 0x00, 0x00, 0x3A, 0x07, 0x23, 0x01, 0x57, 0x13,
                                               0x90, 0x01, 0x56, 0x00, 0x02, 0x01, 0x11, 0x00, 0x50, 0x01,
                                               0x40, 0x00, 0x92, 0x01, 0x01, 0x00, 0xA0, 0x00, 0xF7, 0x01});
}

TEST(LteIntraFrequency, SectionsAndCodes) {
    EXPECT_EQ(ConnectedModeMeasurementMisc().getSectionName(),
              "Connected mode LTE Intra-frequency Measurement");
    EXPECT_EQ(MeasuredNeighborCells().getSectionName(), "Measured Neighbor Cells");
    EXPECT_EQ(DetectedCells().getSectionName(), "Detected Cells");
    const LogCodeArray codes{std::vector<std::int32_t>{0xB179}};
    EXPECT_EQ(ConnectedModeMeasurementMisc().getLogCodeArray(), codes);
    EXPECT_EQ(MeasuredNeighborCells().getLogCodeArray(), codes);
    EXPECT_EQ(DetectedCells().getLogCodeArray(), codes);
}

TEST(LteIntraFrequency, ServingScalarsInOrder) {
    KeySectionHarness<ConnectedModeMeasurementMisc> bound;
    const auto packet = handWrittenIntraFrequency();
    ASSERT_EQ(packet.size(), 43u);
    testing::LogCapture capture;
    bound.feed(packet, kIntraFrequency);
    EXPECT_EQ(testing::keysOf(*bound.section),
              (std::vector<std::string>{"E-ARFCN", "Serving Physical Cell ID", "Subframe Number",
                                        "Serving Filtered RSRP", "Serving Filtered RSRQ"}));
    EXPECT_EQ(bound.text("E-ARFCN"), "1850");
    EXPECT_EQ(bound.text("Serving Physical Cell ID"), "291");
    EXPECT_EQ(bound.text("Subframe Number"), "4951");
    EXPECT_EQ(bound.text("Serving Filtered RSRP"), "-40.00 dBm");  // 400 × 0.25 − 140
    EXPECT_EQ(bound.text("Serving Filtered RSRQ"), "-9.25 dB");    // 86 × 0.125 − 20
    EXPECT_EQ(capture.lines(), (std::vector<testing::LogCapture::Line>{
                                   {kLogWarning, "Connected mode LTE Intra-frequency Measurement"}}));
}

TEST(LteIntraFrequency, MeasuredNeighboursAndDetectedCellAfterThem) {
    ListSectionHarness<MeasuredNeighborCells> measured;
    ListSectionHarness<DetectedCells> detected;
    const auto packet = handWrittenIntraFrequency();
    measured.feed(packet, kIntraFrequency);
    detected.feed(packet, kIntraFrequency);
    ASSERT_EQ(measured.section->size(), 2u);
    EXPECT_EQ(testing::keysOf(measured.row(0)),
              (std::vector<std::string>{"Physical Cell ID", "Filtered RSRP", "Filtered RSRQ"}));
    EXPECT_EQ(testing::textOf(measured.row(0), "Physical Cell ID"), "17");
    EXPECT_EQ(testing::textOf(measured.row(0), "Filtered RSRP"), "-56.00 dBm");  // 336 × 0.25 − 140
    EXPECT_EQ(testing::textOf(measured.row(0), "Filtered RSRQ"), "-12.00 dB");   // 64 × 0.125 − 20
    EXPECT_EQ(testing::textOf(measured.row(1), "Physical Cell ID"), "402");
    EXPECT_EQ(testing::textOf(measured.row(1), "Filtered RSRP"), "-139.75 dBm");
    EXPECT_EQ(testing::textOf(measured.row(1), "Filtered RSRQ"), "0.00 dB");  // eighth-dB 160
    ASSERT_EQ(detected.section->size(), 1u);
    EXPECT_EQ(testing::keysOf(detected.row(0)), std::vector<std::string>{"Physical Cell ID"});
    EXPECT_EQ(testing::textOf(detected.row(0), "Physical Cell ID"), "503");  // read at 29 + 6 × 2 = 41
}

TEST(LteIntraFrequency, ZeroCountsSetTheScalarsAndEmptyBothLists) {
    KeySectionHarness<ConnectedModeMeasurementMisc> misc;
    ListSectionHarness<MeasuredNeighborCells> measured;
    ListSectionHarness<DetectedCells> detected;
    measured.seed();
    detected.seed();
    LteIntraFrequencyRecord record;
    record.earfcn = 100;
    record.servingPhysicalCellId = 7;
    record.subframeNumber = 3;
    record.servingFilteredRsrp = 0;
    record.servingFilteredRsrq = 160;
    const auto packet = buildLteIntraFrequencyRecord(record);
    ASSERT_EQ(packet.size(), 29u);
    misc.feed(packet, kIntraFrequency);
    measured.feed(packet, kIntraFrequency);
    detected.feed(packet, kIntraFrequency);
    EXPECT_EQ(misc.section->size(), 5u);
    EXPECT_EQ(misc.text("E-ARFCN"), "100");
    EXPECT_EQ(misc.text("Serving Physical Cell ID"), "7");
    EXPECT_EQ(misc.text("Subframe Number"), "3");
    EXPECT_EQ(misc.text("Serving Filtered RSRP"), "-140.00 dBm");
    EXPECT_EQ(misc.text("Serving Filtered RSRQ"), "0.00 dB");
    EXPECT_TRUE(measured.section->empty());
    EXPECT_TRUE(detected.section->empty());
}

TEST(LteIntraFrequency, BuiltRecordWithSeveralCells) {
    ListSectionHarness<MeasuredNeighborCells> measured;
    ListSectionHarness<DetectedCells> detected;
    LteIntraFrequencyRecord record;
    record.measured = {{11, 4, 8}, {22, 560, 1}, {33, 0xFFFF, 0xFFFF}};
    record.detected = {101, 202, 303, 404};
    const auto packet = buildLteIntraFrequencyRecord(record);
    measured.feed(packet, kIntraFrequency);
    detected.feed(packet, kIntraFrequency);
    ASSERT_EQ(measured.section->size(), 3u);
    EXPECT_EQ(testing::textOf(measured.row(0), "Filtered RSRP"), "-139.00 dBm");
    EXPECT_EQ(testing::textOf(measured.row(0), "Filtered RSRQ"), "-19.00 dB");
    EXPECT_EQ(testing::textOf(measured.row(1), "Physical Cell ID"), "22");
    EXPECT_EQ(testing::textOf(measured.row(1), "Filtered RSRP"), "0.00 dBm");
    EXPECT_EQ(testing::textOf(measured.row(1), "Filtered RSRQ"), "-19.88 dB");     // −19.875 rounds to even
    EXPECT_EQ(testing::textOf(measured.row(2), "Filtered RSRP"), "16243.75 dBm");  // 65535 × 0.25 − 140
    EXPECT_EQ(testing::textOf(measured.row(2), "Filtered RSRQ"), "8171.88 dB");    // 65535 × 0.125 − 20
    ASSERT_EQ(detected.section->size(), 4u);
    EXPECT_EQ(testing::textOf(detected.row(0), "Physical Cell ID"), "101");
    EXPECT_EQ(testing::textOf(detected.row(3), "Physical Cell ID"), "404");
}

TEST(LteIntraFrequency, CountsPointingPastTheEndReadZeros) {
    ListSectionHarness<MeasuredNeighborCells> measured;
    ListSectionHarness<DetectedCells> detected;
    auto packet = zeroPacket(kIntraFrequency, 29);
    packet[27] = 255;
    packet[28] = 255;
    measured.feed(packet, kIntraFrequency);
    detected.feed(packet, kIntraFrequency);
    ASSERT_EQ(measured.section->size(), 255u);
    ASSERT_EQ(detected.section->size(), 255u);
    EXPECT_EQ(testing::textOf(measured.row(254), "Physical Cell ID"), "0");
    EXPECT_EQ(testing::textOf(measured.row(254), "Filtered RSRP"), "-140.00 dBm");
    EXPECT_EQ(testing::textOf(measured.row(254), "Filtered RSRQ"), "-20.00 dB");
    EXPECT_EQ(testing::textOf(detected.row(254), "Physical Cell ID"), "0");
}

TEST(LteIntraFrequency, TwentyEightBytesChangeNothing) {
    KeySectionHarness<ConnectedModeMeasurementMisc> misc;
    ListSectionHarness<MeasuredNeighborCells> measured;
    ListSectionHarness<DetectedCells> detected;
    measured.seed();
    detected.seed();
    auto packet = handWrittenIntraFrequency();
    packet.resize(28);
    testing::LogCapture capture;
    misc.feed(packet, kIntraFrequency);
    measured.feed(packet, kIntraFrequency);
    detected.feed(packet, kIntraFrequency);
    EXPECT_TRUE(misc.section->empty());
    EXPECT_EQ(measured.section->size(), 1u);
    EXPECT_EQ(detected.section->size(), 1u);
    EXPECT_EQ(capture.texts(), (std::vector<std::string>{"Connected mode LTE Intra-frequency Measurement",
                                                         "Measured Neighbor Cells", "Detected Cells"}));
}

TEST(LteIntraFrequency, OtherCodesAreReportedAndChangeNothing) {
    KeySectionHarness<ConnectedModeMeasurementMisc> misc;
    ListSectionHarness<MeasuredNeighborCells> measured;
    ListSectionHarness<DetectedCells> detected;
    measured.seed();
    testing::LogCapture capture;
    misc.feed(handWrittenIntraFrequency(), 0xB17F);
    measured.feed(handWrittenIntraFrequency(), 0xB180);
    detected.feed(handWrittenIntraFrequency(), 0xFF0001);
    EXPECT_TRUE(misc.section->empty());
    EXPECT_EQ(measured.section->size(), 1u);
    EXPECT_TRUE(detected.section->empty());
    EXPECT_EQ(capture.textsAt(kLogError),
              (std::vector<std::string>{"Received an unknown log message: 45439",
                                        "Received an unknown log message: 45440",
                                        "Received an unknown log message: 16711681"}));
}

}  // namespace
}  // namespace velmar
