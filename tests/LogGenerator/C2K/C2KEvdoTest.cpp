// EV-DO records: status (0x1183), active set (0x12B6) and finger C/I (0x108A).
#include <gtest/gtest.h>

#include "core/platform/SystemLog.h"
#include "logfile/records/CdmaRecords.h"
#include "tests/LogGenerator/C2K/C2KHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::asJson;
using testing::C2KHarness;
using testing::textDictionary;

EvdoStatusRecord connectedStatus() {
    EvdoStatusRecord status;
    status.channel = 1283;  // 0x503: bits 0..2 of byte 14 are the channel's
    status.bandClass = 1;
    status.rxAgc0 = -85;
    status.rxAgc1 = -90;
    status.txAgc = 5;
    status.pnOffset = 168;
    status.deviceState = 5;
    status.sessionState = 4;
    status.uati24 = 0x0A1B2C;
    status.colorCode = 7;
    return status;
}

TEST(C2KEvdoStatus, EveryFieldIsShown) {
    C2KHarness harness;
    harness.feed(buildEvdoStatusRecord(connectedStatus()));
    // The 16 bits at 13 hold the band class in their top five bits: 1283 + 1 × 2048.
    EXPECT_EQ(harness.shown("kChannel"), "3331");
    EXPECT_EQ(harness.shown("k1xEVDODeviceState"), "Connected [5]");
    EXPECT_EQ(harness.shown("kBandClass"), "1.8 to 2.0GHz PCS band [1]");
    EXPECT_EQ(harness.shown("kRxAGC0"), "-85 dBm");
    EXPECT_EQ(harness.shown("kRxAGC1"), "-90 dBm");
    EXPECT_EQ(harness.shown("kTxAGC"), "+5 dBm");
    EXPECT_EQ(harness.shown("kServingPNOffset"), "168 \xC3\x97 64chips");
    EXPECT_EQ(harness.shown("kSessionState"), "Open [4]");
    EXPECT_EQ(harness.shown("kUATI24"), "0x0a1b2c");
    EXPECT_EQ(harness.shown("kColorCode"), "7");
}

TEST(C2KEvdoStatus, ReceiveChainOneAndTransmitterShowNotApplicableBelowAccess) {
    C2KHarness harness;
    EvdoStatusRecord status = connectedStatus();
    status.deviceState = 3;
    harness.feed(buildEvdoStatusRecord(status));
    EXPECT_EQ(harness.shown("k1xEVDODeviceState"), "Idle [3]");
    EXPECT_EQ(harness.shown("kRxAGC1"), "N/A");
    EXPECT_EQ(harness.shown("kTxAGC"), "N/A");
    EXPECT_EQ(harness.shown("kRxAGC0"), "-85 dBm");

    status.deviceState = 4;
    status.txAgc = 0;
    harness.feed(buildEvdoStatusRecord(status));
    EXPECT_EQ(harness.shown("k1xEVDODeviceState"), "Access [4]");
    EXPECT_EQ(harness.shown("kRxAGC1"), "-90 dBm");
    EXPECT_EQ(harness.shown("kTxAGC"), "+0 dBm");
}

TEST(C2KEvdoStatus, InvalidPnOffsetAndValuesBeyondTheTables) {
    C2KHarness harness;
    EvdoStatusRecord status = connectedStatus();
    status.pnOffset = 0xFFFF;
    status.bandClass = 13;
    status.deviceState = 6;
    status.sessionState = 5;
    harness.feed(buildEvdoStatusRecord(status));
    EXPECT_EQ(harness.shown("kServingPNOffset"), "Invalid Value");
    EXPECT_EQ(harness.shown("kBandClass"), "[Bad Value 13]");
    EXPECT_EQ(harness.shown("k1xEVDODeviceState"), "[Reserved 6]");
    EXPECT_EQ(harness.shown("kSessionState"), "[Reserved 5]");

    status.bandClass = 9;
    harness.feed(buildEvdoStatusRecord(status));
    EXPECT_EQ(harness.shown("kBandClass"), "900 MHzband [9]");
}

TEST(C2KEvdoStatus, FortyNineAndFiftyOneBytesAreRejected) {
    C2KHarness harness;
    testing::LogCapture capture;
    EvdoStatusRecord status = connectedStatus();
    status.length = 49;
    harness.feed(buildEvdoStatusRecord(status));
    status.length = 51;
    harness.feed(buildEvdoStatusRecord(status));
    EXPECT_EQ(capture.textsAt(kLogError),
              (std::vector<std::string>{"Log code 0x1183 is 49 bytes long but should be 50 bytes.",
                                        "Log code 0x1183 is 51 bytes long but should be 50 bytes."}));
    EXPECT_EQ(harness.shown("kChannel"), "");
    EXPECT_EQ(harness.shown("kRxAGC1"), "");
}

TEST(C2KEvdoActiveSet, PilotsAreKeyedByIndexAndPn) {
    C2KHarness harness;
    EvdoActiveSetRecord activeSet;
    // 10 × log10(strength / 512): 512 → 0, 256 → −3.0103, 5120 → +10.
    activeSet.pilots = {{100, 512}, {36, 256}, {200, 5120}};
    harness.feed(buildEvdoActiveSetRecord(activeSet));
    const PlistDictionaryRef pilots = harness.shownDictionary("kActiveSetPilots");
    ASSERT_TRUE(pilots);
    EXPECT_EQ(
        asJson(pilots),
        asJson(textDictionary(
            {{"_sorted", "_sorted"}, {"0;100", "+0.00 dB"}, {"1;36", "-3.01 dB"}, {"2;200", "+10.00 dB"}})));
}

TEST(C2KEvdoActiveSet, NoPilotsShowsNone) {
    C2KHarness harness;
    harness.feed(buildEvdoActiveSetRecord({}));
    EXPECT_EQ(harness.shown("kActiveSetPilots"), "(none)");
}

TEST(C2KEvdoActiveSet, LengthMessages) {
    C2KHarness harness;
    testing::LogCapture capture;
    EvdoActiveSetRecord tooShort;
    tooShort.length = 24;
    harness.feed(buildEvdoActiveSetRecord(tooShort));
    EvdoActiveSetRecord missingPilot;
    missingPilot.pilots = {{100, 512}};
    missingPilot.declaredCount = 2;  // needs 49 bytes, has 37
    harness.feed(buildEvdoActiveSetRecord(missingPilot));
    EXPECT_EQ(capture.textsAt(kLogError),
              (std::vector<std::string>{"Log code 0x12b6 is 24 bytes long but must be at least 25 bytes.",
                                        "Log code 0x12b6 is 37 bytes long, but has 2 substructs."}));
    EXPECT_EQ(harness.shown("kActiveSetPilots"), "");

    // Bytes beyond the pilots are allowed.
    capture.clear();
    EvdoActiveSetRecord longer;
    longer.pilots = {{100, 512}};
    longer.length = 45;
    harness.feed(buildEvdoActiveSetRecord(longer));
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
    EXPECT_EQ(asJson(harness.shownDictionary("kActiveSetPilots")),
              asJson(textDictionary({{"_sorted", "_sorted"}, {"0;100", "+0.00 dB"}})));
}

TEST(C2KFingerC2I, AssignedFingersAreKeyedByFingerIndexAndPilot) {
    C2KHarness harness;
    FingerC2IRecord fingers;
    // 10 × log10(c2i / 512): 2048 → +6.0206, 128 → −6.0206.
    fingers.fingers = {{100, 2048}, {65535, 999}, {36, 128}};
    harness.feed(buildFingerC2IRecord(fingers));
    const PlistDictionaryRef shown = harness.shownDictionary("kFingerC2I");
    ASSERT_TRUE(shown);
    EXPECT_EQ(asJson(shown),
              asJson(textDictionary({{"_sorted", "_sorted"}, {"0;100", "+6.02 dB"}, {"2;36", "-6.02 dB"}})));
}

TEST(C2KFingerC2I, NoFingersOrOnlyUnassignedOnesShowNone) {
    C2KHarness harness;
    harness.feed(buildFingerC2IRecord({}));
    EXPECT_EQ(harness.shown("kFingerC2I"), "(none)");

    FingerC2IRecord fingers;
    fingers.fingers = {{100, 2048}};
    harness.feed(buildFingerC2IRecord(fingers));
    ASSERT_TRUE(harness.shownDictionary("kFingerC2I"));
    fingers.fingers = {{65535, 2048}, {65535, 512}};
    harness.feed(buildFingerC2IRecord(fingers));
    EXPECT_EQ(harness.shown("kFingerC2I"), "(none)");
}

TEST(C2KFingerC2I, LengthMessages) {
    C2KHarness harness;
    testing::LogCapture capture;
    FingerC2IRecord tooShort;
    tooShort.length = 22;
    harness.feed(buildFingerC2IRecord(tooShort));
    FingerC2IRecord oneByteTooMany;
    oneByteTooMany.fingers = {{100, 2048}, {36, 128}};
    oneByteTooMany.length = 52;
    harness.feed(buildFingerC2IRecord(oneByteTooMany));
    FingerC2IRecord oneFingerShort;
    oneFingerShort.fingers = {{100, 2048}};
    oneFingerShort.declaredCount = 2;
    harness.feed(buildFingerC2IRecord(oneFingerShort));
    EXPECT_EQ(capture.textsAt(kLogError),
              (std::vector<std::string>{
                  "Log code 0x108a is 22 bytes long but must be at least 23 bytes.",
                  "Log code 0x108a has bad length of 52 bytes, but has 2 substructs (size=23).",
                  "Log code 0x108a has bad length of 37 bytes, but has 2 substructs (size=23)."}));
    EXPECT_EQ(harness.shown("kFingerC2I"), "");
}

}  // namespace
}  // namespace velmar
