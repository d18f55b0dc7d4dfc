// 1x status (0x119C): the subpacket search, the receive chains, the active set with its energy formula, and
// the traffic frame-error rate shown "(old)" outside the Traffic state.
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

Cdma1xRadio trafficRadio() {
    Cdma1xRadio radio;
    radio.rx0BandClass = 1;
    radio.rx1BandClass = 0;
    radio.rx0Channel = 25;
    radio.rx1Channel = 1013;
    radio.rxAgc0 = -100;
    radio.rxAgc1 = 50;
    radio.txPower = -123;
    return radio;
}

// L = 8, M = 2, Q = 3: 2^(2Q−3) × E ÷ (9 × L² × M) − 1 ÷ L = 8E ÷ 1152 − 0.125 = E ÷ 144 − 0.125.
Cdma1xActiveSet fourPilots() {
    Cdma1xActiveSet activeSet;
    activeSet.l = 8;
    activeSet.m = 2;
    activeSet.q = 3;
    activeSet.f = 2;  // entries of (6 × 2 + 15) & ~3 = 24 bytes
    activeSet.referencePn = 300;
    activeSet.pilots = {{12, 162}, {300, 1458}, {48, 36}, {7, 0}};
    return activeSet;
}

CdmaSubpacketRecord statusRecord(std::uint8_t deviceState, Cdma1xActiveSet activeSet = fourPilots()) {
    CdmaSubpacketRecord record;
    record.subpackets = {cdma1xStateSubpacket(deviceState), cdma1xRadioSubpacket(trafficRadio()),
                         cdma1xActiveSetSubpacket(activeSet), cdma1xFingerSubpacket()};
    record.trailingBytes = 4;
    return record;
}

TEST(C2K1xStatus, TrafficStateShowsBothReceiveChainsAndTheTransmitter) {
    C2KHarness harness;
    harness.feed(build1xStatusRecord(statusRecord(8)));
    EXPECT_EQ(harness.shown("k1xDeviceState"), "Traffic [8]");
    EXPECT_EQ(harness.shown("k1xRx0BandClass"), "1.8 to 2.0GHz PCS band [1]");
    EXPECT_EQ(harness.shown("k1xRx0ChanNum"), "25");
    EXPECT_EQ(harness.shown("k1xRxAGC0"), "-96.65 dBm");  // −100 × 0.334 − 63.248 = −96.648
    EXPECT_EQ(harness.shown("k1xRx1BandClass"), "800 MHz cellular band [0]");
    EXPECT_EQ(harness.shown("k1xRx1ChanNum"), "1013");
    EXPECT_EQ(harness.shown("k1xRxAGC1"), "-46.55 dBm");  // 50 × 0.334 − 63.248 = −46.548
    EXPECT_EQ(harness.shown("k1xTxAGC"), "-12.30 dBm");   // −123 ÷ 10
}

TEST(C2K1xStatus, OutsideTrafficTheSecondChainAndTransmitterShowNotApplicable) {
    C2KHarness harness;
    harness.feed(build1xStatusRecord(statusRecord(6)));
    EXPECT_EQ(harness.shown("k1xDeviceState"), "Paging [6]");
    EXPECT_EQ(harness.shown("k1xRx0ChanNum"), "25");
    EXPECT_EQ(harness.shown("k1xRx1BandClass"), "N/A");
    EXPECT_EQ(harness.shown("k1xRx1ChanNum"), "N/A");
    EXPECT_EQ(harness.shown("k1xRxAGC1"), "N/A");
    EXPECT_EQ(harness.shown("k1xTxAGC"), "N/A");
}

TEST(C2K1xStatus, DeviceStateAndBandBeyondTheirTables) {
    C2KHarness harness;
    CdmaSubpacketRecord record = statusRecord(12);
    Cdma1xRadio radio = trafficRadio();
    radio.rx0BandClass = 13;
    record.subpackets[1] = cdma1xRadioSubpacket(radio);
    harness.feed(build1xStatusRecord(record));
    EXPECT_EQ(harness.shown("k1xDeviceState"), "[Bad Value 12]");
    EXPECT_EQ(harness.shown("k1xRx0BandClass"), "[Bad Value 13]");
}

TEST(C2K1xStatus, ActiveSetPilotsWithEnergiesAndTheReferencePilot) {
    C2KHarness harness;
    harness.feed(build1xStatusRecord(statusRecord(8)));
    const PlistDictionaryRef pilots = harness.shownDictionary("k1xActiveSetInfo");
    ASSERT_TRUE(pilots);
    // E = 162: 1.125 − 0.125 = 1 → 0 dB. E = 1458: 10.125 − 0.125 = 10 → 10 dB (the reference pilot).
    // E = 36: 0.25 − 0.125 = 0.125 → 10 × log10(0.125) = −9.0309 dB. E = 0: −0.125, floored at 0.00001 → −50
    // dB.
    EXPECT_EQ(asJson(pilots), asJson(textDictionary({{"_sorted", "_sorted"},
                                                     {"0;12", "+0.00 dB"},
                                                     {"1;300", "(ref pilot) +10.00 dB"},
                                                     {"2;48", "-9.03 dB"},
                                                     {"3;7", "-50.00 dB"}})));
}

TEST(C2K1xStatus, EnergyFormulaWithOtherParameters) {
    C2KHarness harness;
    Cdma1xActiveSet activeSet;
    // L = 4, M = 1, Q = 2, F = 1: 2 × E ÷ 144 − 0.25. E = 500: 6.94444 − 0.25 = 6.69444 → 8.2572 dB.
    activeSet.l = 4;
    activeSet.m = 1;
    activeSet.q = 2;
    activeSet.f = 1;  // entries of (6 + 15) & ~3 = 20 bytes; energy at entry + 28
    activeSet.referencePn = 1;
    activeSet.pilots = {{400, 500}, {401, 18}};  // E = 18: 0.25 − 0.25 = 0, floored → −50 dB
    harness.feed(build1xStatusRecord(statusRecord(8, activeSet)));
    EXPECT_EQ(
        asJson(harness.shownDictionary("k1xActiveSetInfo")),
        asJson(textDictionary({{"_sorted", "_sorted"}, {"0;400", "+8.26 dB"}, {"1;401", "-50.00 dB"}})));
}

TEST(C2K1xStatus, NoPilotsLeavesTheMarkerAlone) {
    C2KHarness harness;
    Cdma1xActiveSet activeSet = fourPilots();
    activeSet.pilots.clear();
    harness.feed(build1xStatusRecord(statusRecord(8, activeSet)));
    EXPECT_EQ(asJson(harness.shownDictionary("k1xActiveSetInfo")),
              asJson(textDictionary({{"_sorted", "_sorted"}})));
}

TEST(C2K1xStatus, TooShortPacket) {
    C2KHarness harness;
    testing::LogCapture capture;
    CdmaSubpacketRecord record;
    PlistData packet = build1xStatusRecord(record);
    packet.resize(16);
    harness.feed(packet);
    EXPECT_EQ(capture.textsAt(kLogError),
              std::vector<std::string>{"Log code 0x119c is 16 bytes long but must be at least 17 bytes."});
}

TEST(C2K1xStatus, MissingSubpacketIsAWarningAndShowsNothing) {
    C2KHarness harness;
    testing::LogCapture capture;
    CdmaSubpacketRecord record = statusRecord(8);
    record.subpackets.erase(record.subpackets.begin() + 2);  // no active set
    harness.feed(build1xStatusRecord(record));
    EXPECT_EQ(capture.textsAt(kLogWarning),
              std::vector<std::string>{"Log code 0x119c: missing subpacket (ss=1,rf=1,ai=0,fi=1)."});
    EXPECT_TRUE(capture.textsAt(kLogError).empty());
    EXPECT_EQ(harness.shown("k1xDeviceState"), "");
}

TEST(C2K1xStatus, SubpacketThatEndsAtThePacketsLastByteIsABadSize) {
    C2KHarness harness;
    testing::LogCapture capture;
    CdmaSubpacketRecord record = statusRecord(8);
    record.trailingBytes = 0;  // the finger subpacket (12 bytes, index 3) ends with the packet
    harness.feed(build1xStatusRecord(record));
    EXPECT_EQ(capture.textsAt(kLogError),
              std::vector<std::string>{"Log code error in subpkt#3: bad size (12)."});
    EXPECT_EQ(capture.textsAt(kLogWarning),
              std::vector<std::string>{"Log code 0x119c: missing subpacket (ss=1,rf=1,ai=1,fi=0)."});
}

TEST(C2K1xStatus, SubpacketWhoseSizeRunsPastTheEndStopsEverySearchThatReachesIt) {
    C2KHarness harness;
    testing::LogCapture capture;
    CdmaSubpacketRecord record = statusRecord(8);
    record.subpackets[1].declaredSize = 500;
    harness.feed(build1xStatusRecord(record));
    // The state subpacket (index 0) is found; the three other searches stop at index 1.
    EXPECT_EQ(capture.textsAt(kLogError),
              (std::vector<std::string>{"Log code error in subpkt#1: bad size (500).",
                                        "Log code error in subpkt#1: bad size (500).",
                                        "Log code error in subpkt#1: bad size (500)."}));
    EXPECT_EQ(capture.textsAt(kLogWarning),
              std::vector<std::string>{"Log code 0x119c: missing subpacket (ss=1,rf=0,ai=0,fi=0)."});
}

TEST(C2K1xStatus, SearchWalksNoMoreSubpacketsThanTheCountSays) {
    C2KHarness harness;
    testing::LogCapture capture;
    CdmaSubpacketRecord record = statusRecord(8);
    record.declaredCount = 3;  // the finger subpacket is not counted
    harness.feed(build1xStatusRecord(record));
    EXPECT_EQ(capture.textsAt(kLogWarning),
              std::vector<std::string>{"Log code 0x119c: missing subpacket (ss=1,rf=1,ai=1,fi=0)."});
}

TEST(C2K1xStatus, SubpacketsAreFoundInAnyOrder) {
    C2KHarness harness;
    CdmaSubpacketRecord record = statusRecord(8);
    std::swap(record.subpackets[0], record.subpackets[3]);
    harness.feed(build1xStatusRecord(record));
    EXPECT_EQ(harness.shown("k1xDeviceState"), "Traffic [8]");
}

TEST(C2K1xStatus, OutsideTrafficTheLastFrameErrorRateIsShownOldAndForgotten) {
    C2KHarness harness;
    harness.state->set("TrafficFER", PlistValue::real(0.25));
    harness.feed(build1xStatusRecord(statusRecord(8)));
    // In traffic the rate is left to the traffic records.
    EXPECT_EQ(harness.shown("k1xTrafficFER"), "");
    EXPECT_TRUE(harness.state->contains("TrafficFER"));

    harness.feed(build1xStatusRecord(statusRecord(6)));
    EXPECT_EQ(harness.shown("k1xTrafficFER"), "25.00% (old)");
    EXPECT_FALSE(harness.state->contains("TrafficFER"));

    // Nothing left to show: the old value stays as it is.
    harness.feed(build1xStatusRecord(statusRecord(6)));
    EXPECT_EQ(harness.shown("k1xTrafficFER"), "25.00% (old)");
}

}  // namespace
}  // namespace velmar
