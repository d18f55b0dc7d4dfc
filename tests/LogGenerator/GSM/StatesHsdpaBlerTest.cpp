// HSDPAInformation and BLER: key sections whose lists are array values.
#include <gtest/gtest.h>

#include "LogGenerator/GSM/BLER.h"
#include "LogGenerator/GSM/HSDPAInformation.h"
#include "core/platform/SystemLog.h"
#include "logfile/records/GsmStateRecords.h"
#include "logfile/records/RecordBuilder.h"
#include "tests/LogGenerator/DecoderHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::cut;
using testing::KeySectionHarness;
using testing::LogCapture;
using testing::rowTexts;
using Strings = std::vector<std::string>;
using Lines = std::vector<LogCapture::Line>;

TEST(StatesHsdpa, SectionNameCodesAndEntryLine) {
    KeySectionHarness<HSDPAInformation> hsdpa;
    EXPECT_EQ(hsdpa.decoder->getSectionName(), "HSDPA Info");
    EXPECT_EQ(hsdpa.decoder->getLogCodeArray(), (std::vector<std::int32_t>{0x4221}));
    LogCapture capture;
    hsdpa.feed(buildHsdpaRecord({}));
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "HSDPA Info"}}));
}

TEST(StatesHsdpa, SubFramesAndCarrier) {
    KeySectionHarness<HSDPAInformation> hsdpa;
    hsdpa.feed(RecordBuilder(0x4221).u8(13, 7).u8(14, 0xFF).u8(15, 0x07).resize(18).build());
    EXPECT_EQ(hsdpa.keys(), (Strings{"Version", "Sub Frames", "Carrier Info"}));
    EXPECT_EQ(hsdpa.text("Version"), "7");
    EXPECT_EQ(hsdpa.text("Sub Frames"), "1023");
    EXPECT_EQ(hsdpa.text("Carrier Info"), "MIMO");
    // 0xF8: sub-frame high bits 0, carrier (0xF8 >> 2) & 3 = 2; bits 4..7 are not read.
    hsdpa.feed(RecordBuilder(0x4221).u8(13, 255).u8(14, 0x10).u8(15, 0xF8).resize(18).build());
    EXPECT_EQ(hsdpa.text("Version"), "255");
    EXPECT_EQ(hsdpa.text("Sub Frames"), "16");
    EXPECT_EQ(hsdpa.text("Carrier Info"), "Dual Carrier");
    const Strings carriers = {"Single Carrier", "MIMO", "Dual Carrier", "Reserved"};
    for (std::uint8_t carrier = 0; carrier < 4; ++carrier) {
        hsdpa.feed(buildHsdpaRecord({.subFrames = 513, .carrier = carrier}));
        EXPECT_EQ(hsdpa.text("Carrier Info"), carriers[carrier]);
        EXPECT_EQ(hsdpa.text("Sub Frames"), "513");
    }
}

TEST(StatesHsdpa, SecondaryListIsReadAt18Plus162TimesP) {
    KeySectionHarness<HSDPAInformation> hsdpa;
    // P = 1, S = 1. Primary entry at 18; a decoy entry at 27 (where a packed list would put it); the
    // secondary entry the decoder reads at 18 + 162 = 180.
    RecordBuilder builder(0x4221);
    builder.u8(16, 1).u8(17, 1);
    builder.u8(18, 4).u32(19, 0xFFFFFFFF).u16(23, 65535).u16(25, 3);
    builder.u8(27, 99).u32(28, 99).u16(32, 99).u16(34, 99);
    builder.u8(180, 6).u32(181, 123456).u16(185, 700).u16(187, 12);
    hsdpa.feed(builder.build());
    EXPECT_EQ(hsdpa.keys(), (Strings{"Version", "Sub Frames", "Carrier Info", "Primary HARQ Process",
                                     "Secondary HARQ Process"}));
    EXPECT_EQ(rowTexts(*hsdpa.section->find("Primary HARQ Process")),
              (Strings{"Process ID=4, No Rx Bits=4294967295, New Tx=65535, Block Errors=3"}));
    EXPECT_EQ(rowTexts(*hsdpa.section->find("Secondary HARQ Process")),
              (Strings{"Process ID=6, No Rx Bits=123456, New Tx=700, Block Errors=12"}));
}

TEST(StatesHsdpa, BuiltRecordWithSeveralEntries) {
    KeySectionHarness<HSDPAInformation> hsdpa;
    hsdpa.feed(buildHsdpaRecord({.version = 2,
                                 .subFrames = 1000,
                                 .carrier = 3,
                                 .primary = {{0, 1000, 10, 1}, {1, 2000, 20, 2}},
                                 .secondary = {{7, 70000, 7, 0}}}));
    EXPECT_EQ(hsdpa.text("Version"), "2");
    EXPECT_EQ(hsdpa.text("Sub Frames"), "1000");
    EXPECT_EQ(hsdpa.text("Carrier Info"), "Reserved");
    EXPECT_EQ(rowTexts(*hsdpa.section->find("Primary HARQ Process")),
              (Strings{"Process ID=0, No Rx Bits=1000, New Tx=10, Block Errors=1",
                       "Process ID=1, No Rx Bits=2000, New Tx=20, Block Errors=2"}));
    EXPECT_EQ(rowTexts(*hsdpa.section->find("Secondary HARQ Process")),
              (Strings{"Process ID=7, No Rx Bits=70000, New Tx=7, Block Errors=0"}));
    // 18 + 162·2 = 342 is where the secondary entry lies; the record ends after it.
    EXPECT_EQ(buildHsdpaRecord({.primary = {{}, {}}, .secondary = {{}}}).size(), 342u + 9u);
}

TEST(StatesHsdpa, EmptyListsKeepTheirEarlierRows) {
    KeySectionHarness<HSDPAInformation> hsdpa;
    hsdpa.feed(buildHsdpaRecord({.primary = {{1, 1, 1, 1}}, .secondary = {{2, 2, 2, 2}}}));
    hsdpa.feed(buildHsdpaRecord({.version = 9, .subFrames = 5, .carrier = 1}));
    EXPECT_EQ(hsdpa.text("Version"), "9");
    EXPECT_EQ(hsdpa.text("Sub Frames"), "5");
    EXPECT_EQ(hsdpa.text("Carrier Info"), "MIMO");
    EXPECT_EQ(rowTexts(*hsdpa.section->find("Primary HARQ Process")),
              (Strings{"Process ID=1, No Rx Bits=1, New Tx=1, Block Errors=1"}));
    EXPECT_EQ(rowTexts(*hsdpa.section->find("Secondary HARQ Process")),
              (Strings{"Process ID=2, No Rx Bits=2, New Tx=2, Block Errors=2"}));
    // Primary only: the secondary list stays.
    hsdpa.feed(buildHsdpaRecord({.primary = {{3, 3, 3, 3}}}));
    EXPECT_EQ(rowTexts(*hsdpa.section->find("Primary HARQ Process")),
              (Strings{"Process ID=3, No Rx Bits=3, New Tx=3, Block Errors=3"}));
    EXPECT_EQ(rowTexts(*hsdpa.section->find("Secondary HARQ Process")),
              (Strings{"Process ID=2, No Rx Bits=2, New Tx=2, Block Errors=2"}));
}

TEST(StatesHsdpa, CountsPastTheEndReadZeros) {
    KeySectionHarness<HSDPAInformation> hsdpa;
    // P = 3 with one entry present; S = 2 at 18 + 486 = 504, far past the end.
    hsdpa.feed(buildHsdpaRecord(
        {.primary = {{5, 50, 5, 5}}, .primaryCountOverride = 3, .secondaryCountOverride = 2}));
    EXPECT_EQ(rowTexts(*hsdpa.section->find("Primary HARQ Process")),
              (Strings{"Process ID=5, No Rx Bits=50, New Tx=5, Block Errors=5",
                       "Process ID=0, No Rx Bits=0, New Tx=0, Block Errors=0",
                       "Process ID=0, No Rx Bits=0, New Tx=0, Block Errors=0"}));
    EXPECT_EQ(rowTexts(*hsdpa.section->find("Secondary HARQ Process")),
              (Strings{"Process ID=0, No Rx Bits=0, New Tx=0, Block Errors=0",
                       "Process ID=0, No Rx Bits=0, New Tx=0, Block Errors=0"}));
    // 255 × 162 past the start: still nothing read outside the buffer.
    hsdpa.feed(buildHsdpaRecord({.primaryCountOverride = 255, .secondaryCountOverride = 255}));
    EXPECT_EQ(hsdpa.section->find("Primary HARQ Process")->array()->size(), 255u);
    EXPECT_EQ(hsdpa.section->find("Secondary HARQ Process")->array()->size(), 255u);
}

TEST(StatesHsdpa, ShortRecordsAndOtherCodesAreIgnoredSilently) {
    KeySectionHarness<HSDPAInformation> hsdpa;
    LogCapture capture;
    hsdpa.feed(cut(buildHsdpaRecord({.version = 1}), 17));
    hsdpa.feed(buildHsdpaRecord({.version = 1}), 0x4222);
    hsdpa.feed(buildHsdpaRecord({.version = 1}), 0x4116);
    EXPECT_EQ(capture.lines(),
              (Lines{{kLogWarning, "HSDPA Info"}, {kLogWarning, "HSDPA Info"}, {kLogWarning, "HSDPA Info"}}));
    EXPECT_TRUE(hsdpa.section->empty());
    hsdpa.feed(cut(buildHsdpaRecord({.version = 1}), 18));
    EXPECT_EQ(hsdpa.text("Version"), "1");
}

TEST(StatesBler, SectionNameCodesAndEntryLine) {
    KeySectionHarness<BLER> bler;
    EXPECT_EQ(bler.decoder->getSectionName(), "BLER");
    EXPECT_EQ(bler.decoder->getLogCodeArray(), (std::vector<std::int32_t>{0x4116}));
    LogCapture capture;
    bler.feed(buildBlockErrorRecord({}));
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "BLER"}}));
}

TEST(StatesBler, ChannelsAreSignedDecimal) {
    KeySectionHarness<BLER> bler;
    bler.feed(buildBlockErrorRecord(
        {.windowSize = 65535, .channels = {{3, 0xFFFFFFFF, 17}, {31, 1000, 0x80000000}}}));
    EXPECT_EQ(bler.keys(), (Strings{"Window Size", "Transport Channels"}));
    EXPECT_EQ(bler.text("Window Size"), "65535");
    EXPECT_EQ(rowTexts(*bler.section->find("Transport Channels")),
              (Strings{"Transport Channel ID=3, CRC Received=-1, CRC Received in Error=17",
                       "Transport Channel ID=31, CRC Received=1000, CRC Received in Error=-2147483648"}));
}

TEST(StatesBler, ZeroChannelsStoreAnEmptyArray) {
    KeySectionHarness<BLER> bler;
    bler.feed(buildBlockErrorRecord({.windowSize = 10, .channels = {{1, 1, 1}}}));
    bler.feed(buildBlockErrorRecord({.windowSize = 20}));
    EXPECT_EQ(bler.text("Window Size"), "20");
    const PlistValue* channels = bler.section->find("Transport Channels");
    ASSERT_NE(channels, nullptr);
    ASSERT_TRUE(channels->isArray());
    EXPECT_TRUE(channels->array()->empty());
}

TEST(StatesBler, CountPastTheEnd) {
    KeySectionHarness<BLER> bler;
    bler.feed(buildBlockErrorRecord({.windowSize = 4, .channels = {{9, 90, 9}}, .countOverride = 3}));
    EXPECT_EQ(rowTexts(*bler.section->find("Transport Channels")),
              (Strings{"Transport Channel ID=9, CRC Received=90, CRC Received in Error=9",
                       "Transport Channel ID=0, CRC Received=0, CRC Received in Error=0",
                       "Transport Channel ID=0, CRC Received=0, CRC Received in Error=0"}));
    // Exactly 16 bytes with a count of 255.
    bler.feed(cut(buildBlockErrorRecord({.windowSize = 1, .countOverride = 255}), 16));
    EXPECT_EQ(bler.text("Window Size"), "1");
    EXPECT_EQ(bler.section->find("Transport Channels")->array()->size(), 255u);
}

TEST(StatesBler, ShortRecordAndUnknownCodes) {
    KeySectionHarness<BLER> bler;
    LogCapture capture;
    bler.feed(cut(buildBlockErrorRecord({.windowSize = 5}), 15));
    bler.feed(buildBlockErrorRecord({.windowSize = 5}), 0x4117);  // 16663
    bler.feed(buildBlockErrorRecord({.windowSize = 5}), 0x4221);  // 16929
    EXPECT_EQ(capture.lines(), (Lines{{kLogWarning, "BLER"},
                                      {kLogWarning, "BLER"},
                                      {kLogError, "Received an unknown log message: 16663"},
                                      {kLogWarning, "BLER"},
                                      {kLogError, "Received an unknown log message: 16929"}}));
    EXPECT_TRUE(bler.section->empty());
}

}  // namespace
}  // namespace velmar
