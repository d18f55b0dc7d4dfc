// 1x traffic frame errors (0x119D): the filtered frame-error rate kept in the state as "TrafficFER".
#include <gtest/gtest.h>

#include "LogGenerator/C2K/C2KFerFilter.h"
#include "core/platform/SystemLog.h"
#include "logfile/records/CdmaRecords.h"
#include "tests/LogGenerator/C2K/C2KHarness.h"
#include "tests/support/LogCapture.h"

namespace velmar {
namespace {

using testing::C2KHarness;

PlistData trafficPacket(bool erasure) {
    CdmaSubpacketRecord record;
    record.subpackets = {cdma1xStateSubpacket(8), cdma1xTrafficDemodSubpacket(erasure)};
    record.trailingBytes = 2;
    return build1xTrafficRecord(record);
}

double storedRate(const C2KHarness& harness) {
    const auto rate = harness.state->get("TrafficFER").realValue();
    return rate ? *rate : -1.0;
}

TEST(C2KTrafficFer, OneErasureFromNothing) {
    C2KHarness harness;
    harness.feed(trafficPacket(true));
    // 1 × 1/64 + 0 × 63/64 = 0.015625, shown with two decimals: 1.5625 % → 1.56%.
    EXPECT_EQ(storedRate(harness), 0.015625);
    EXPECT_EQ(harness.shown("k1xTrafficFER"), "1.56%");
}

TEST(C2KTrafficFer, TwoErasures) {
    C2KHarness harness;
    harness.feed(trafficPacket(true));
    harness.feed(trafficPacket(true));
    // 1/64 + 1/64 × 63/64 = 127/4096 = 0.031005859375.
    EXPECT_EQ(storedRate(harness), 127.0 / 4096.0);
    EXPECT_EQ(harness.shown("k1xTrafficFER"), "3.10%");
}

TEST(C2KTrafficFer, SixtyFourErasuresConvergeTowardAHundredPercent) {
    C2KHarness harness;
    double previous = 0.0;
    for (int i = 0; i < 64; ++i) {
        harness.feed(trafficPacket(true));
        const double now = storedRate(harness);
        EXPECT_GT(now, previous);
        EXPECT_LT(now, 1.0);
        previous = now;
    }
    // After n erasures from 0 the rate is 1 − (63/64)^n; (63/64)^64 = 0.3649865..., so 63.50 %.
    EXPECT_NEAR(storedRate(harness), 0.6350134757560926, 1e-12);
    EXPECT_EQ(harness.shown("k1xTrafficFER"), "63.50%");
}

TEST(C2KTrafficFer, GoodFrameDecaysTheRate) {
    C2KHarness harness;
    harness.feed(trafficPacket(true));
    harness.feed(trafficPacket(false));
    // 1/64 × 63/64 = 63/4096 = 0.015380859375.
    EXPECT_EQ(storedRate(harness), 63.0 / 4096.0);
    EXPECT_EQ(harness.shown("k1xTrafficFER"), "1.54%");
}

TEST(C2KTrafficFer, FilterFunction) {
    EXPECT_EQ(c2k::filterFrameErrorRate(0.0, true), 0.015625);
    EXPECT_EQ(c2k::filterFrameErrorRate(1.0, true), 1.0);
    EXPECT_EQ(c2k::filterFrameErrorRate(0.5, false), 0.4921875);
}

TEST(C2KTrafficFer, StartsFromAnIntegerLeftInTheState) {
    C2KHarness harness;
    harness.state->set("TrafficFER", PlistValue::integer(1));
    harness.feed(trafficPacket(false));
    EXPECT_EQ(storedRate(harness), 0.984375);
    EXPECT_EQ(harness.shown("k1xTrafficFER"), "98.44%");  // 0 × 1/64 + 1 × 63/64 = 98.4375 %
}

TEST(C2KTrafficFer, MissingSubpacketAndTooShortPacket) {
    C2KHarness harness;
    testing::LogCapture capture;
    CdmaSubpacketRecord record;
    record.subpackets = {cdma1xStateSubpacket(8)};
    record.trailingBytes = 1;
    harness.feed(build1xTrafficRecord(record));
    PlistData shortPacket = build1xTrafficRecord({});
    shortPacket.resize(16);
    harness.feed(shortPacket);
    EXPECT_EQ(capture.textsAt(kLogWarning),
              std::vector<std::string>{"Log code 0x119d: missing traffic demod subpacket."});
    EXPECT_EQ(capture.textsAt(kLogError),
              std::vector<std::string>{"Log code 0x119d is 16 bytes long but must be at least 17 bytes."});
    EXPECT_FALSE(harness.state->contains("TrafficFER"));
    EXPECT_EQ(harness.shown("k1xTrafficFER"), "");
}

TEST(C2KTrafficFer, DemodSubpacketRunningPastTheEndIsNotUsed) {
    C2KHarness harness;
    testing::LogCapture capture;
    CdmaSubpacketRecord record;
    record.subpackets = {cdma1xStateSubpacket(8), cdma1xTrafficDemodSubpacket(true)};
    record.subpackets[1].declaredSize = 0x1234;
    record.trailingBytes = 2;
    harness.feed(build1xTrafficRecord(record));
    EXPECT_EQ(capture.textsAt(kLogError),
              std::vector<std::string>{"Log code error in subpkt#1: bad size (4660)."});
    EXPECT_EQ(capture.textsAt(kLogWarning),
              std::vector<std::string>{"Log code 0x119d: missing traffic demod subpacket."});
    EXPECT_FALSE(harness.state->contains("TrafficFER"));
}

}  // namespace
}  // namespace velmar
