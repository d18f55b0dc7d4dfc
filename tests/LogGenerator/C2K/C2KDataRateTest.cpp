// EV-DO data rates from the forward-link (0x1192) and reverse-link (0x127E) packet counters, over two and
// three samples, with the samples kept in the state and in "ExtraInfo".
#include <gtest/gtest.h>

#include "core/platform/SystemLog.h"
#include "logfile/records/CdmaRecords.h"
#include "tests/LogGenerator/C2K/C2KHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::C2KHarness;

std::int64_t number(const PlistDictionaryRef& dictionary, std::string_view key) {
    const auto value = dictionary ? dictionary->get(key).integerValue() : std::nullopt;
    return value ? *value : -1;
}

// Counter weights used below: 0 → 128, 1 → 256, 3 → 1024, 4 → 0, 27 → 2048, 38 → 1024, 52 → 5120, 55 → 0.
EvdoForwardLinkRecord forwardSample(int which) {
    EvdoForwardLinkRecord record;
    record.counters[4] = 1000;  // a counter without payload
    record.counters[55] = 7;    // likewise
    record.counters[52] = 3;    // 15360
    if (which == 1) {
        record.sequence = 100;
        record.counters[0] = 10;  // 1280
        record.counters[3] = 2;   // 2048: total 18688
    } else {
        record.sequence = which == 2 ? 102 : 105;
        record.counters[0] = 20;  // 2560
        record.counters[1] = 7;   // 1792
        record.counters[3] = 4;   // 4096
        record.counters[27] = 1;  // 2048: total 25856
        if (which == 3) {
            record.counters[38] = 30;  // 30720: total 56576
        }
    }
    return record;
}

TEST(C2KDataRate, ForwardLinkFirstSampleShowsNothingAndIsKept) {
    C2KHarness harness;
    harness.feed(buildEvdoForwardLinkRecord(forwardSample(1)));
    EXPECT_EQ(harness.shown("kFLDataRate"), "");
    EXPECT_EQ(number(harness.state, "FLDataSeqNum"), 100);
    EXPECT_EQ(number(harness.state, "FLDataSent"), 18688);
    const PlistDictionaryRef extra = harness.extraInfo();
    EXPECT_EQ(number(extra, "FLDataSeqNum1"), 100);
    EXPECT_EQ(number(extra, "FLDataSent1"), 18688);
    EXPECT_FALSE(extra->contains("FLDataSeqNum2"));
    EXPECT_FALSE(extra->contains("FLDataSent2"));
}

TEST(C2KDataRate, ForwardLinkOverTwoAndThreeSamples) {
    C2KHarness harness;
    harness.feed(buildEvdoForwardLinkRecord(forwardSample(1)));
    harness.feed(buildEvdoForwardLinkRecord(forwardSample(2)));
    // (25856 − 18688) ÷ ((102 − 100) × 1024) = 7168 ÷ 2048 = 3.5.
    EXPECT_EQ(harness.shown("kFLDataRate"), "3.50 kbps");
    const PlistDictionaryRef extra = harness.extraInfo();
    EXPECT_EQ(number(extra, "FLDataSeqNum2"), 100);
    EXPECT_EQ(number(extra, "FLDataSent2"), 18688);
    EXPECT_EQ(number(extra, "FLDataSeqNum1"), 102);
    EXPECT_EQ(number(extra, "FLDataSent1"), 25856);
    EXPECT_EQ(number(harness.state, "FLDataSeqNum"), 102);
    EXPECT_EQ(number(harness.state, "FLDataSent"), 25856);

    harness.feed(buildEvdoForwardLinkRecord(forwardSample(3)));
    // (56576 − 25856) ÷ ((105 − 102) × 1024) = 30720 ÷ 3072 = 10.
    EXPECT_EQ(harness.shown("kFLDataRate"), "10.00 kbps");
    EXPECT_EQ(number(extra, "FLDataSeqNum2"), 102);
    EXPECT_EQ(number(extra, "FLDataSent2"), 25856);
    EXPECT_EQ(number(extra, "FLDataSeqNum1"), 105);
    EXPECT_EQ(number(extra, "FLDataSent1"), 56576);
    EXPECT_EQ(harness.shown("kRLDataRate"), "");
}

TEST(C2KDataRate, SequenceThatDidNotAdvanceShowsNoNewRateButReplacesTheSample) {
    C2KHarness harness;
    harness.feed(buildEvdoForwardLinkRecord(forwardSample(1)));
    harness.feed(buildEvdoForwardLinkRecord(forwardSample(2)));
    EvdoForwardLinkRecord again = forwardSample(3);
    again.sequence = 102;
    harness.feed(buildEvdoForwardLinkRecord(again));
    EXPECT_EQ(harness.shown("kFLDataRate"), "3.50 kbps");
    EXPECT_EQ(number(harness.state, "FLDataSeqNum"), 102);
    EXPECT_EQ(number(harness.state, "FLDataSent"), 56576);
    EXPECT_EQ(number(harness.extraInfo(), "FLDataSeqNum2"), 100);
}

// Reverse link, [block][rate class][slot]; counted slots: 0..2 of blocks 0 and 1, 0..1 of block 2.
EvdoReverseLinkRecord reverseSample(int which) {
    EvdoReverseLinkRecord record;
    record.sequence = which == 1 ? 7 : which == 2 ? 9 : 10;
    record.counters[0][0][0] = 4;  // class 0, 128 bytes
    record.counters[1][0][2] = 1;
    record.counters[2][0][1] = 5;     // class 0: 10 packets, 1280
    record.counters[0][0][3] = 1000;  // slots that are not counted
    record.counters[2][0][2] = 999;
    record.counters[1][11][1] = 1;  // class 11: 12288; total 13568
    if (which >= 2) {
        record.counters[2][4][0] = 6;  // class 4, 1024 bytes: 6144
        record.counters[0][0][1] = 8;  // class 0: 1024 more; total 20736
    }
    if (which == 3) {
        record.counters[1][2][0] = 5;  // class 2, 512 bytes: 2560; total 23296
    }
    return record;
}

TEST(C2KDataRate, ReverseLinkOverTwoAndThreeSamples) {
    C2KHarness harness;
    harness.feed(buildEvdoReverseLinkRecord(reverseSample(1)));
    EXPECT_EQ(harness.shown("kRLDataRate"), "");
    EXPECT_EQ(number(harness.state, "RLDataSeqNum"), 7);
    EXPECT_EQ(number(harness.state, "RLDataSent"), 13568);
    EXPECT_EQ(number(harness.extraInfo(), "RLDataSent1"), 13568);

    harness.feed(buildEvdoReverseLinkRecord(reverseSample(2)));
    // (20736 − 13568) ÷ ((9 − 7) × 1024) = 7168 ÷ 2048 = 3.5.
    EXPECT_EQ(harness.shown("kRLDataRate"), "3.50 kbps");
    const PlistDictionaryRef extra = harness.extraInfo();
    EXPECT_EQ(number(extra, "RLDataSeqNum2"), 7);
    EXPECT_EQ(number(extra, "RLDataSent2"), 13568);
    EXPECT_EQ(number(extra, "RLDataSeqNum1"), 9);
    EXPECT_EQ(number(extra, "RLDataSent1"), 20736);

    harness.feed(buildEvdoReverseLinkRecord(reverseSample(3)));
    // (23296 − 20736) ÷ ((10 − 9) × 1024) = 2.5.
    EXPECT_EQ(harness.shown("kRLDataRate"), "2.50 kbps");
    EXPECT_EQ(number(extra, "RLDataSeqNum2"), 9);
    EXPECT_EQ(number(harness.state, "RLDataSent"), 23296);
    EXPECT_EQ(harness.shown("kFLDataRate"), "");
}

TEST(C2KDataRate, LengthMessages) {
    C2KHarness harness;
    testing::LogCapture capture;
    EvdoForwardLinkRecord forward = forwardSample(1);
    forward.length = 240;
    harness.feed(buildEvdoForwardLinkRecord(forward));
    EvdoReverseLinkRecord reverse = reverseSample(1);
    reverse.length = 1749;
    harness.feed(buildEvdoReverseLinkRecord(reverse));
    EXPECT_EQ(
        capture.textsAt(kLogError),
        (std::vector<std::string>{"Log code 0x1192 is 240 bytes long but must be at least 241 bytes.",
                                  "Log code 0x127e is 1749 bytes long but must be at least 1750 bytes."}));
    EXPECT_FALSE(harness.state->contains("FLDataSeqNum"));
    EXPECT_FALSE(harness.state->contains("RLDataSeqNum"));
}

}  // namespace
}  // namespace velmar
