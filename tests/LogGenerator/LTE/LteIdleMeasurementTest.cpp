#include <gtest/gtest.h>

#include "LogGenerator/LTE/NeighborCellsList.h"
#include "LogGenerator/LTE/NeighborMeasurementMisc.h"
#include "LogGenerator/LTE/ServingCellMeasurement.h"
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

constexpr std::int32_t kServingMeasurement = 0xB17F;
constexpr std::int32_t kNeighbourMeasurement = 0xB180;

// 0xB17F written out. Fields (raw): version 5, E-ARFCN 6699, PCI 453, layer priority 11, measured RSRP 281,
// average RSRP 267, measured RSRQ 69, average RSRQ 81, RSSI 161, Qrxlevmin 37, P_Max 53, Max UE Tx Power 43,
// Srxlev 77, DRX cycles 41, S intra 19, S non-intra 11, rules updated 1, rules 13.
std::vector<std::uint8_t> handWrittenServingMeasurement() {
    return packetWithPayload(kServingMeasurement,
                             {0x05, 0x00, 0x00, 0x00, 0x2B, 0x1A, 0xC5, 0x17, 0x19, 0x17,
                              0x16, 0xA3, 0xA1, 0xCA, 0xDA, 0x0A, 0xCD, 0x74, 0x5A, 0x36});
}

// 0xB180 written out: version 3, E-ARFCN 3101, Qrxlevmin 45, count bits 1 (two cells). Cell 0: PCI 331, RSSI
// 165, RSRP 275, average RSRP 231, RSRQ 75, average RSRQ 57, Srxlev 83, frequency offset 0xFEDC, frame offset
// 1443, sample offset 374483. Cell 1: 183, 92, 417, 341, 35, 106, 15, 258, 713, 173477.
std::vector<std::uint8_t> handWrittenNeighbourMeasurement() {
    return packetWithPayload(
        kNeighbourMeasurement,
        {0x03, 0x00, 0x00, 0x00, 0x1D, 0x0C, 0x6D, 0x00, 0x4B, 0x4B, 0x27, 0x02, 0xE7, 0x96, 0xB9, 0x29,
         0xDC, 0xFE, 0x00, 0x00, 0xA3, 0x9D, 0xB6, 0x2D, 0x00, 0x00, 0x00, 0x00, 0xB7, 0xB8, 0x42, 0x03,
         0x55, 0x47, 0xEA, 0x07, 0x02, 0x01, 0x00, 0x00, 0xC9, 0x2A, 0x2D, 0x15, 0x00, 0x00, 0x00, 0x00});
}

TEST(LteServingMeasurement, SectionAndCode) {
    ServingCellMeasurement decoder;
    EXPECT_EQ(decoder.getSectionName(), "Serving Cell Measurements");
    EXPECT_EQ(decoder.getLogCodeArray(), (LogCodeArray{std::vector<std::int32_t>{0xB17F}}));
}

TEST(LteServingMeasurement, EveryFieldInOrder) {
    KeySectionHarness<ServingCellMeasurement> bound;
    const auto packet = handWrittenServingMeasurement();
    ASSERT_EQ(packet.size(), 33u);
    testing::LogCapture capture;
    bound.feed(packet, kServingMeasurement);
    EXPECT_EQ(testing::keysOf(*bound.section),
              (std::vector<std::string>{
                  "Version", "E-ARFCN", "Physical Cell ID", "Serving Layer Priority", "Measured RSRP",
                  "Average RSRP", "Measured RSRQ", "Average RSRQ", "Measured RSSI", "Qrxlevmin", "P_Max",
                  "Max UE Tx Power", "Srxlev", "Num of Consecutive DRX Cycles of S < 0", "S Intra Search",
                  "S Non Intra Search", "Measurement Rules Updated", "Measurement Rules"}));
    EXPECT_EQ(bound.text("Version"), "5");
    EXPECT_EQ(bound.text("E-ARFCN"), "6699");
    EXPECT_EQ(bound.text("Physical Cell ID"), "453");
    EXPECT_EQ(bound.text("Serving Layer Priority"), "11");
    EXPECT_EQ(bound.text("Measured RSRP"), "-69.75 dBm");  // 281 × 0.25 − 140
    EXPECT_EQ(bound.text("Average RSRP"), "-73.25 dBm");   // 267 × 0.25 − 140
    EXPECT_EQ(bound.text("Measured RSRQ"), "-12.75 dB");   // 69 × 0.25 − 30
    EXPECT_EQ(bound.text("Average RSRQ"), "-9.75 dB");     // 81 × 0.25 − 30
    EXPECT_EQ(bound.text("Measured RSSI"), "-59.50 dBm");  // 161 × 0.5 − 140
    EXPECT_EQ(bound.text("Qrxlevmin"), "-66 dBm");         // 37 × 2 − 140
    EXPECT_EQ(bound.text("P_Max"), "23 dBm");              // 53 − 30
    EXPECT_EQ(bound.text("Max UE Tx Power"), "13 dBm");    // 43 − 30
    EXPECT_EQ(bound.text("Srxlev"), "47 dBm");             // 77 − 30
    EXPECT_EQ(bound.text("Num of Consecutive DRX Cycles of S < 0"), "41");
    EXPECT_EQ(bound.text("S Intra Search"), "38 dB");       // 19 × 2
    EXPECT_EQ(bound.text("S Non Intra Search"), "22 dBm");  // 11 × 2, shown in dBm
    EXPECT_EQ(bound.text("Measurement Rules Updated"), "True");
    EXPECT_EQ(bound.text("Measurement Rules"), "13");
    EXPECT_EQ(capture.texts(), std::vector<std::string>{"Serving Cell Measurements"});
}

TEST(LteServingMeasurement, NotPresentValues) {
    KeySectionHarness<ServingCellMeasurement> bound;
    LteIdleServingMeasurementRecord record;
    record.pMax = 64;
    record.sIntraSearch = 32;
    record.sNonIntraSearch = 32;
    record.maxUeTxPower = 63;
    bound.feed(buildLteIdleServingMeasurementRecord(record), kServingMeasurement);
    EXPECT_EQ(bound.text("P_Max"), "Not Present");
    EXPECT_EQ(bound.text("S Intra Search"), "Not Present");
    EXPECT_EQ(bound.text("S Non Intra Search"), "Not Present");
    EXPECT_EQ(bound.text("Max UE Tx Power"), "33 dBm");
    EXPECT_EQ(bound.text("Measurement Rules Updated"), "False");

    record.pMax = 63;
    record.sIntraSearch = 31;
    record.sNonIntraSearch = 33;
    bound.feed(buildLteIdleServingMeasurementRecord(record), kServingMeasurement);
    EXPECT_EQ(bound.text("P_Max"), "33 dBm");
    EXPECT_EQ(bound.text("S Intra Search"), "62 dB");
    EXPECT_EQ(bound.text("S Non Intra Search"), "66 dBm");
}

TEST(LteServingMeasurement, MaxUeTxPowerIsSixBitsAndNeverNotPresent) {
    KeySectionHarness<ServingCellMeasurement> bound;
    // Bits 6..12 of bytes 27..28 would read 64 if the field were seven bits wide: only bit 4 of byte 28 is
    // set.
    auto packet = zeroPacket(kServingMeasurement, 33);
    packet[28] = 0x10;
    bound.feed(packet, kServingMeasurement);
    EXPECT_EQ(bound.text("Max UE Tx Power"), "-30 dBm");
    EXPECT_EQ(bound.text("Srxlev"), "-30 dBm");
    EXPECT_EQ(bound.text("P_Max"), "-30 dBm");
}

TEST(LteServingMeasurement, ThirtyTwoBytesChangeNothingAndOtherCodesAreReported) {
    KeySectionHarness<ServingCellMeasurement> bound;
    auto packet = handWrittenServingMeasurement();
    packet.pop_back();
    testing::LogCapture capture;
    bound.feed(packet, kServingMeasurement);
    EXPECT_TRUE(bound.section->empty());
    bound.feed(handWrittenServingMeasurement(), 0xB180);
    EXPECT_TRUE(bound.section->empty());
    EXPECT_EQ(capture.textsAt(kLogError), std::vector<std::string>{"Received an unknown log message: 45440"});
}

TEST(LteNeighbourMeasurement, SectionsAndCodes) {
    EXPECT_EQ(NeighborMeasurementMisc().getSectionName(), "Neighbor Measurements");
    EXPECT_EQ(NeighborCellsList().getSectionName(), "Neighbor Cells List");
    const LogCodeArray codes{std::vector<std::int32_t>{0xB180}};
    EXPECT_EQ(NeighborMeasurementMisc().getLogCodeArray(), codes);
    EXPECT_EQ(NeighborCellsList().getLogCodeArray(), codes);
}

TEST(LteNeighbourMeasurement, ScalarsInOrder) {
    KeySectionHarness<NeighborMeasurementMisc> bound;
    bound.feed(handWrittenNeighbourMeasurement(), kNeighbourMeasurement);
    EXPECT_EQ(testing::keysOf(*bound.section), (std::vector<std::string>{"Version", "E-ARFCN", "Qrxlevmin"}));
    EXPECT_EQ(bound.text("Version"), "3");
    EXPECT_EQ(bound.text("E-ARFCN"), "3101");
    EXPECT_EQ(bound.text("Qrxlevmin"), "-50 dBm");  // 45 × 2 − 140
}

TEST(LteNeighbourMeasurement, EveryEntryFieldWithHalfDbLevelsAndRepeatedAntennaOffsets) {
    ListSectionHarness<NeighborCellsList> bound;
    testing::LogCapture capture;
    bound.feed(handWrittenNeighbourMeasurement(), kNeighbourMeasurement);
    ASSERT_EQ(bound.section->size(), 2u);
    const auto& first = bound.row(0);
    EXPECT_EQ(testing::keysOf(first),
              (std::vector<std::string>{"Physical Cell ID", "Measured RSSI", "Measured RSRP", "Average RSRP",
                                        "Measured RSRQ", "Average RSRQ", "Srxlev", "Frequency Offset",
                                        "Ant 0 Frame Offset", "Ant 0 Sample Offset", "Ant 1 Frame Offset",
                                        "Ant 1 Sample Offset"}));
    EXPECT_EQ(testing::textOf(first, "Physical Cell ID"), "331");
    EXPECT_EQ(testing::textOf(first, "Measured RSSI"), "-57.50 dBm");  // 165 × 0.5 − 140
    EXPECT_EQ(testing::textOf(first, "Measured RSRP"), "-2.50 dBm");   // 275 × 0.5 − 140
    EXPECT_EQ(testing::textOf(first, "Average RSRP"), "-24.50 dBm");   // 231 × 0.5 − 140
    EXPECT_EQ(testing::textOf(first, "Measured RSRQ"), "-11.25 dB");   // 75 × 0.25 − 30
    EXPECT_EQ(testing::textOf(first, "Average RSRQ"), "-15.75 dB");    // 57 × 0.25 − 30
    EXPECT_EQ(testing::textOf(first, "Srxlev"), "53 dBm");
    EXPECT_EQ(testing::textOf(first, "Frequency Offset"), "65244");
    EXPECT_EQ(testing::textOf(first, "Ant 0 Frame Offset"), "1443");
    EXPECT_EQ(testing::textOf(first, "Ant 0 Sample Offset"), "374483");
    EXPECT_EQ(testing::textOf(first, "Ant 1 Frame Offset"), "1443");
    EXPECT_EQ(testing::textOf(first, "Ant 1 Sample Offset"), "374483");
    const auto& second = bound.row(1);
    EXPECT_EQ(testing::textOf(second, "Physical Cell ID"), "183");
    EXPECT_EQ(testing::textOf(second, "Measured RSSI"), "-94.00 dBm");
    EXPECT_EQ(testing::textOf(second, "Measured RSRP"), "68.50 dBm");
    EXPECT_EQ(testing::textOf(second, "Average RSRP"), "30.50 dBm");
    EXPECT_EQ(testing::textOf(second, "Measured RSRQ"), "-21.25 dB");
    EXPECT_EQ(testing::textOf(second, "Average RSRQ"), "-3.50 dB");
    EXPECT_EQ(testing::textOf(second, "Srxlev"), "-15 dBm");
    EXPECT_EQ(testing::textOf(second, "Frequency Offset"), "258");
    EXPECT_EQ(testing::textOf(second, "Ant 0 Frame Offset"), "713");
    EXPECT_EQ(testing::textOf(second, "Ant 0 Sample Offset"), "173477");
    EXPECT_EQ(testing::textOf(second, "Ant 1 Frame Offset"), "713");
    EXPECT_EQ(testing::textOf(second, "Ant 1 Sample Offset"), "173477");

    EXPECT_EQ(
        capture.textsAt(kLogWarning),
        (std::vector<std::string>{
            "Neighbor Cells List", "Number of neighboring cells being reported: 2\n",
            "Physical Cell ID: 331\n", "Measured RSSI: -57.500000\n", "Measured RSSI: -2.500000\n",
            "Measured RSSI: -24.500000\n", "Measured RSSI: -11.250000\n", "Measured RSSI: -15.750000\n",
            "Physical Cell ID: 183\n", "Measured RSSI: -94.000000\n", "Measured RSSI: 68.500000\n",
            "Measured RSSI: 30.500000\n", "Measured RSSI: -21.250000\n", "Measured RSSI: -3.500000\n"}));
}

TEST(LteNeighbourMeasurement, CountBitsZeroYieldOneEntry) {
    ListSectionHarness<NeighborCellsList> bound;
    auto packet = zeroPacket(kNeighbourMeasurement, 21);
    packet[19] = 0x3F;  // Qrxlevmin bits all set, count bits 0
    packet[20] = 0xF8;  // bits 11..15 of the count word: outside the count
    testing::LogCapture capture;
    bound.feed(packet, kNeighbourMeasurement);
    ASSERT_EQ(bound.section->size(), 1u);
    EXPECT_EQ(testing::textOf(bound.row(0), "Physical Cell ID"), "0");
    EXPECT_EQ(testing::textOf(bound.row(0), "Measured RSRP"), "-140.00 dBm");
    EXPECT_EQ(testing::textOf(bound.row(0), "Measured RSRQ"), "-30.00 dB");
    EXPECT_EQ(testing::textOf(bound.row(0), "Srxlev"), "-30 dBm");
    EXPECT_TRUE(capture.contains("Number of neighboring cells being reported: 1\n"));
}

TEST(LteNeighbourMeasurement, MaximumCountPointingPastTheEndReadsZeros) {
    ListSectionHarness<NeighborCellsList> bound;
    LteIdleNeighbourMeasurementRecord record;
    record.neighbours = {{300, 10, 20, 30, 40, 50, 60, 70, 80, 90}};
    record.countBitsOverride = 31;
    const auto packet = buildLteIdleNeighbourMeasurementRecord(record);
    ASSERT_EQ(packet.size(), 41u);
    bound.feed(packet, kNeighbourMeasurement);
    ASSERT_EQ(bound.section->size(), 32u);
    EXPECT_EQ(testing::textOf(bound.row(0), "Physical Cell ID"), "300");
    EXPECT_EQ(testing::textOf(bound.row(0), "Measured RSSI"), "-135.00 dBm");
    EXPECT_EQ(testing::textOf(bound.row(0), "Measured RSRP"), "-130.00 dBm");
    EXPECT_EQ(testing::textOf(bound.row(0), "Average RSRP"), "-125.00 dBm");
    EXPECT_EQ(testing::textOf(bound.row(0), "Measured RSRQ"), "-20.00 dB");
    EXPECT_EQ(testing::textOf(bound.row(0), "Average RSRQ"), "-17.50 dB");
    EXPECT_EQ(testing::textOf(bound.row(0), "Srxlev"), "30 dBm");
    EXPECT_EQ(testing::textOf(bound.row(0), "Frequency Offset"), "70");
    EXPECT_EQ(testing::textOf(bound.row(0), "Ant 1 Frame Offset"), "80");
    EXPECT_EQ(testing::textOf(bound.row(0), "Ant 1 Sample Offset"), "90");
    EXPECT_EQ(testing::textOf(bound.row(31), "Physical Cell ID"), "0");
    EXPECT_EQ(testing::textOf(bound.row(31), "Ant 0 Sample Offset"), "0");
}

TEST(LteNeighbourMeasurement, TwentyBytesChangeNothingAndOtherCodesAreReported) {
    KeySectionHarness<NeighborMeasurementMisc> misc;
    ListSectionHarness<NeighborCellsList> list;
    list.seed();
    auto packet = handWrittenNeighbourMeasurement();
    packet.resize(20);
    testing::LogCapture capture;
    misc.feed(packet, kNeighbourMeasurement);
    list.feed(packet, kNeighbourMeasurement);
    EXPECT_TRUE(misc.section->empty());
    EXPECT_EQ(list.section->size(), 1u);
    EXPECT_EQ(capture.texts(), (std::vector<std::string>{"Neighbor Measurements", "Neighbor Cells List"}));
    misc.feed(handWrittenNeighbourMeasurement(), 0xB17F);
    list.feed(handWrittenNeighbourMeasurement(), 0xB17F);
    EXPECT_TRUE(misc.section->empty());
    EXPECT_EQ(list.section->size(), 1u);
    EXPECT_EQ(capture.textsAt(kLogError),
              (std::vector<std::string>{"Received an unknown log message: 45439",
                                        "Received an unknown log message: 45439"}));
}

}  // namespace
}  // namespace velmar
