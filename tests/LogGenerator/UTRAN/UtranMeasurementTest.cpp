#include <gtest/gtest.h>

#include "LogGenerator/UTRAN/CCTRCHSIRMeasurement.h"
#include "LogGenerator/UTRAN/GSMNeighbhorMeasurements.h"
#include "LogGenerator/UTRAN/TRCHBLERMeasurement.h"
#include "LogGenerator/UTRAN/UTRANNeighbhorMeasurements.h"
#include "core/platform/SystemLog.h"
#include "logfile/records/UtranRecords.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::Entries;
using testing::entriesOf;
using testing::ListSectionHarness;
using testing::packetWithPayload;
using testing::zeroPacket;

constexpr std::int32_t kNeighbours = 0xD00A;
constexpr std::int32_t kGsmNeighbours = 0xD00E;
constexpr std::int32_t kChannelQuality = 0xD00C;

std::vector<std::string> sirOf(const PlistDictionary& row) {
    std::vector<std::string> values;
    const PlistValue* sir = row.find("SIR");
    if (sir != nullptr && sir->isArray()) {
        for (const auto& value : *sir->array()) {
            values.push_back(value.string() ? *value.string() : "<not a string>");
        }
    }
    return values;
}

// 0xD00A with byte 16 = 0x05 (count 2; bit 0 is not part of the count) and two entries written out at 168 and
// 184: (UARFCN 10838, cell 91, RSCP raw 128, status 1, in JDCS) and (9712, 38, 195, status 3, not in JDCS).
std::vector<std::uint8_t> handWrittenNeighbours() {
    auto packet = zeroPacket(kNeighbours, 200);
    packet[16] = 0x05;
    const std::uint8_t first[] = {0x56, 0xEA, 0x16, 0xB0};
    const std::uint8_t second[] = {0xF0, 0xA5, 0x69, 0x78};
    std::copy(std::begin(first), std::end(first), packet.begin() + 168);
    std::copy(std::begin(second), std::end(second), packet.begin() + 184);
    return packet;
}

TEST(UtranMeasurements, SectionsAndCodes) {
    EXPECT_EQ(UTRANNeighbhorMeasurements().getSectionName(), "Neighbor Cell List");
    EXPECT_EQ(GSMNeighbhorMeasurements().getSectionName(), "GSM Neighbor Cell List");
    EXPECT_EQ(TRCHBLERMeasurement().getSectionName(), "TRCH BLER");
    EXPECT_EQ(CCTRCHSIRMeasurement().getSectionName(), "CCTRCH SIR");
    EXPECT_EQ(UTRANNeighbhorMeasurements().getLogCodeArray(),
              (LogCodeArray{std::vector<std::int32_t>{0xD00A}}));
    EXPECT_EQ(GSMNeighbhorMeasurements().getLogCodeArray(),
              (LogCodeArray{std::vector<std::int32_t>{0xD00E}}));
    EXPECT_EQ(TRCHBLERMeasurement().getLogCodeArray(), (LogCodeArray{std::vector<std::int32_t>{0xD00C}}));
    EXPECT_EQ(CCTRCHSIRMeasurement().getLogCodeArray(), (LogCodeArray{std::vector<std::int32_t>{0xD00C}}));
}

TEST(UtranNeighbours, EveryEntryField) {
    ListSectionHarness<UTRANNeighbhorMeasurements> bound;
    testing::LogCapture capture;
    bound.feed(handWrittenNeighbours(), kNeighbours);
    ASSERT_EQ(bound.section->size(), 2u);
    EXPECT_EQ(entriesOf(bound.row(0)), (Entries{{"UARFCN", "10838"},
                                                {"Cell ID", "91"},
                                                {"Filter RSCP", "0.500000"},
                                                {"Status", "MSET"},
                                                {"inJDCS", "TRUE"}}));
    // 195 / 256 = 0.76171875; status 3 leaves the key out.
    EXPECT_EQ(
        entriesOf(bound.row(1)),
        (Entries{{"UARFCN", "9712"}, {"Cell ID", "38"}, {"Filter RSCP", "0.761719"}, {"inJDCS", "FALSE"}}));
    EXPECT_EQ(capture.lines(),
              (std::vector<testing::LogCapture::Line>{{kLogWarning, "NeighbhorMeasurements List"}}));
}

TEST(UtranNeighbours, ByteSixteenThreeYieldsOneEntryAt168) {
    ListSectionHarness<UTRANNeighbhorMeasurements> bound;
    auto packet = handWrittenNeighbours();
    packet[16] = 0x03;
    bound.feed(packet, kNeighbours);
    ASSERT_EQ(bound.section->size(), 1u);
    EXPECT_EQ(testing::textOf(bound.row(0), "UARFCN"), "10838");
    EXPECT_EQ(testing::textOf(bound.row(0), "Filter RSCP"), "0.500000");
}

TEST(UtranNeighbours, StatusNames) {
    ListSectionHarness<UTRANNeighbhorMeasurements> bound;
    UtranNeighbourMeasurementRecord record;
    record.neighbours = {{1, 2, 3, 0, false}, {4, 5, 6, 2, true}, {16383, 127, 255, 3, true}};
    bound.feed(buildUtranNeighbourMeasurementRecord(record), kNeighbours);
    ASSERT_EQ(bound.section->size(), 3u);
    EXPECT_EQ(entriesOf(bound.row(0)), (Entries{{"UARFCN", "1"},
                                                {"Cell ID", "2"},
                                                {"Filter RSCP", "0.011719"},
                                                {"Status", "ASET"},
                                                {"inJDCS", "FALSE"}}));
    EXPECT_EQ(testing::textOf(bound.row(1), "Status"), "DSET");
    EXPECT_EQ(
        entriesOf(bound.row(2)),
        (Entries{{"UARFCN", "16383"}, {"Cell ID", "127"}, {"Filter RSCP", "0.996094"}, {"inJDCS", "TRUE"}}));
}

TEST(UtranNeighbours, ZeroCountEmptiesTheList) {
    ListSectionHarness<UTRANNeighbhorMeasurements> bound;
    bound.seed();
    auto packet = handWrittenNeighbours();
    packet[16] = 0x01;
    bound.feed(packet, kNeighbours);
    EXPECT_TRUE(bound.section->empty());
}

TEST(UtranNeighbours, CountCannotExceed127AndEntriesPastTheEndReadZeros) {
    ListSectionHarness<UTRANNeighbhorMeasurements> bound;
    auto packet = zeroPacket(kNeighbours, 21);
    packet[16] = 0xFF;
    bound.feed(packet, kNeighbours);
    ASSERT_EQ(bound.section->size(), 127u);
    EXPECT_EQ(entriesOf(bound.row(126)), (Entries{{"UARFCN", "0"},
                                                  {"Cell ID", "0"},
                                                  {"Filter RSCP", "0.000000"},
                                                  {"Status", "ASET"},
                                                  {"inJDCS", "FALSE"}}));
}

TEST(UtranNeighbours, TwentyBytesAndOtherCodesChangeNothingSilently) {
    ListSectionHarness<UTRANNeighbhorMeasurements> bound;
    bound.seed();
    auto packet = zeroPacket(kNeighbours, 20);
    packet[16] = 0x02;
    testing::LogCapture capture;
    bound.feed(packet, kNeighbours);
    bound.feed(handWrittenNeighbours(), kGsmNeighbours);
    EXPECT_EQ(bound.section->size(), 1u);
    EXPECT_EQ(capture.texts(),
              (std::vector<std::string>{"NeighbhorMeasurements List", "NeighbhorMeasurements List"}));
}

TEST(UtranGsmNeighbours, TheListIsEmptyAfterEveryRecord) {
    ListSectionHarness<GSMNeighbhorMeasurements> bound;
    bound.seed();
    // Two entries written out: (cell 11578, band bit set, BSIC invalid, NCC 5, BCC 3, ARFCN 512, RSSI -85)
    // and (4097, 0, 1, 7, 0, 1023, -110).
    const auto packet =
        packetWithPayload(kGsmNeighbours, {0x00, 0x00, 0x00, 0x02, 0x3A, 0x6D, 0x05, 0x03, 0x00, 0x02,
                                           0xAB, 0xFF, 0x01, 0x90, 0x07, 0x00, 0xFF, 0x03, 0x92, 0xFF});
    testing::LogCapture capture;
    bound.feed(packet, kGsmNeighbours);
    EXPECT_TRUE(bound.section->empty());
    EXPECT_EQ(capture.texts(), std::vector<std::string>{"GSM Neighbor Cell List"});

    bound.seed();
    UtranGsmNeighbourMeasurementRecord record;
    record.neighbours.resize(3);
    record.countOverride = 255;
    bound.feed(buildUtranGsmNeighbourMeasurementRecord(record), kGsmNeighbours);
    EXPECT_TRUE(bound.section->empty());
}

TEST(UtranGsmNeighbours, ShortRecordsAndOtherCodesLeaveTheListAlone) {
    ListSectionHarness<GSMNeighbhorMeasurements> bound;
    bound.seed();
    bound.feed(zeroPacket(kGsmNeighbours, 16), kGsmNeighbours);
    bound.feed(zeroPacket(kGsmNeighbours, 17), kNeighbours);
    EXPECT_EQ(bound.section->size(), 1u);
    bound.feed(zeroPacket(kGsmNeighbours, 17), kGsmNeighbours);
    EXPECT_TRUE(bound.section->empty());
}

// 0xD00C with n = 3 (byte 14 = 0xC0, bits 0..3 of byte 15 zero) and two composite channels (byte 15 = 0x20):
// transport entries (5, 17), (6, 0), (31, 200) at 17; composite entries at 289 + 34 × 3 = 391 and 399.
std::vector<std::uint8_t> handWrittenChannelQuality() {
    auto packet = zeroPacket(kChannelQuality, 407);
    packet[14] = 0xC0;
    packet[15] = 0x20;
    const std::uint8_t transport[] = {5, 17, 6, 0, 31, 200};
    const std::uint8_t composite[] = {1, 2, 10, 20, 30, 40, 50, 60, 9, 4, 255, 1, 2, 3, 4, 128};
    std::copy(std::begin(transport), std::end(transport), packet.begin() + 17);
    std::copy(std::begin(composite), std::end(composite), packet.begin() + 391);
    return packet;
}

TEST(UtranChannelQuality, TransportChannelBler) {
    ListSectionHarness<TRCHBLERMeasurement> bound;
    testing::LogCapture capture;
    bound.feed(handWrittenChannelQuality(), kChannelQuality);
    ASSERT_EQ(bound.section->size(), 3u);
    EXPECT_EQ(entriesOf(bound.row(0)), (Entries{{"TRCH ID", "5"}, {"TRCH BLER Measurement", "17"}}));
    EXPECT_EQ(entriesOf(bound.row(1)), (Entries{{"TRCH ID", "6"}, {"TRCH BLER Measurement", "0"}}));
    EXPECT_EQ(entriesOf(bound.row(2)), (Entries{{"TRCH ID", "31"}, {"TRCH BLER Measurement", "200"}}));
    EXPECT_EQ(capture.lines(),
              (std::vector<testing::LogCapture::Line>{{kLogNotice, "TRCH BLER Measurement"}}));
}

TEST(UtranChannelQuality, CompositeChannelsBehindThirtyFourBytesPerTransportChannel) {
    ListSectionHarness<CCTRCHSIRMeasurement> bound;
    testing::LogCapture capture;
    bound.feed(handWrittenChannelQuality(), kChannelQuality);
    ASSERT_EQ(bound.section->size(), 2u);
    EXPECT_EQ(testing::keysOf(bound.row(0)), (std::vector<std::string>{"CCTRCH ID", "TSNUM", "SIR"}));
    EXPECT_EQ(testing::textOf(bound.row(0), "CCTRCH ID"), "1");
    EXPECT_EQ(testing::textOf(bound.row(0), "TSNUM"), "2");
    EXPECT_EQ(sirOf(bound.row(0)), (std::vector<std::string>{"10", "20", "30", "40", "50", "60"}));
    EXPECT_EQ(testing::textOf(bound.row(1), "CCTRCH ID"), "9");
    EXPECT_EQ(testing::textOf(bound.row(1), "TSNUM"), "4");
    EXPECT_EQ(sirOf(bound.row(1)), (std::vector<std::string>{"255", "1", "2", "3", "4", "128"}));
    EXPECT_EQ(capture.lines(),
              (std::vector<testing::LogCapture::Line>{{kLogWarning, "CCTRCH SIR Measurement"}}));
}

TEST(UtranChannelQuality, TwoTransportChannelsPutTheOnlyCompositeEntryAt357) {
    ListSectionHarness<CCTRCHSIRMeasurement> bound;
    auto packet = zeroPacket(kChannelQuality, 365);
    packet[14] = 0x80;
    packet[15] = 0x10;
    packet[357] = 42;
    packet[358] = 3;
    packet[364] = 77;
    bound.feed(packet, kChannelQuality);
    ASSERT_EQ(bound.section->size(), 1u);
    EXPECT_EQ(testing::textOf(bound.row(0), "CCTRCH ID"), "42");
    EXPECT_EQ(testing::textOf(bound.row(0), "TSNUM"), "3");
    EXPECT_EQ(sirOf(bound.row(0)), (std::vector<std::string>{"0", "0", "0", "0", "0", "77"}));
}

TEST(UtranChannelQuality, TransportCountSpanningTwoBytes) {
    ListSectionHarness<TRCHBLERMeasurement> trch;
    ListSectionHarness<CCTRCHSIRMeasurement> cctrch;
    UtranChannelQualityRecord record;
    // n = 37 = 0b100101: bits 6..7 of byte 14 hold 01, bits 0..3 of byte 15 hold 1001; ten composite
    // channels.
    for (std::uint8_t k = 0; k < 37; ++k) {
        record.transportChannels.push_back(
            {static_cast<std::uint8_t>(k + 1), static_cast<std::uint8_t>(2 * k)});
    }
    for (std::uint8_t k = 0; k < 10; ++k) {
        record.compositeChannels.push_back({static_cast<std::uint8_t>(100 + k), k, {k, 1, 2, 3, 4, 5}});
    }
    const auto packet = buildUtranChannelQualityRecord(record);
    ASSERT_EQ(packet.size(), 289u + 34u * 37u + 80u);
    EXPECT_EQ(packet[14], 0x40);
    EXPECT_EQ(packet[15], 0xA9);
    trch.feed(packet, kChannelQuality);
    cctrch.feed(packet, kChannelQuality);
    ASSERT_EQ(trch.section->size(), 37u);
    EXPECT_EQ(entriesOf(trch.row(36)), (Entries{{"TRCH ID", "37"}, {"TRCH BLER Measurement", "72"}}));
    ASSERT_EQ(cctrch.section->size(), 10u);
    EXPECT_EQ(testing::textOf(cctrch.row(9), "CCTRCH ID"), "109");
    EXPECT_EQ(testing::textOf(cctrch.row(9), "TSNUM"), "9");
    EXPECT_EQ(sirOf(cctrch.row(9)), (std::vector<std::string>{"9", "1", "2", "3", "4", "5"}));
}

TEST(UtranChannelQuality, MaximumCountsPointingPastTheEndReadZeros) {
    ListSectionHarness<TRCHBLERMeasurement> trch;
    ListSectionHarness<CCTRCHSIRMeasurement> cctrch;
    auto packet = zeroPacket(kChannelQuality, 17);
    packet[14] = 0xFF;
    packet[15] = 0xFF;
    trch.feed(packet, kChannelQuality);
    cctrch.feed(packet, kChannelQuality);
    ASSERT_EQ(trch.section->size(), 63u);
    ASSERT_EQ(cctrch.section->size(), 15u);
    EXPECT_EQ(entriesOf(trch.row(62)), (Entries{{"TRCH ID", "0"}, {"TRCH BLER Measurement", "0"}}));
    EXPECT_EQ(sirOf(cctrch.row(14)), (std::vector<std::string>{"0", "0", "0", "0", "0", "0"}));
}

TEST(UtranChannelQuality, SixteenBytesAndOtherCodesChangeNothingSilently) {
    ListSectionHarness<TRCHBLERMeasurement> trch;
    ListSectionHarness<CCTRCHSIRMeasurement> cctrch;
    trch.seed();
    cctrch.seed();
    auto packet = handWrittenChannelQuality();
    packet.resize(16);
    testing::LogCapture capture;
    trch.feed(packet, kChannelQuality);
    cctrch.feed(packet, kChannelQuality);
    trch.feed(handWrittenChannelQuality(), kNeighbours);
    cctrch.feed(handWrittenChannelQuality(), kNeighbours);
    EXPECT_EQ(trch.section->size(), 1u);
    EXPECT_EQ(cctrch.section->size(), 1u);
    EXPECT_EQ(capture.textsAt(kLogError), std::vector<std::string>{});
    EXPECT_EQ(capture.texts(), (std::vector<std::string>{"TRCH BLER Measurement", "CCTRCH SIR Measurement",
                                                         "TRCH BLER Measurement", "CCTRCH SIR Measurement"}));
}

}  // namespace
}  // namespace velmar
