#include "service/ReplayPacer.h"

#include <gtest/gtest.h>

#include <vector>

namespace velmar {
namespace {

using Bytes = std::vector<std::uint8_t>;

// An ordinary 0xB0C1 packet whose timestamp's upper 48 bits are ticks (1/800 s).
Bytes packetAt(std::uint64_t ticks) {
    Bytes packet = {0x01, 0x0D, 0x00, 0xC1, 0xB0};
    const std::uint64_t raw = ticks << 16;
    for (int i = 0; i < 8; ++i) {
        packet.push_back(static_cast<std::uint8_t>(raw >> (8 * i)));
    }
    packet.push_back(0x00);
    return packet;
}

constexpr std::uint64_t kStart = 0x100000;

TEST(ReplayPacer, ReadsTheUpperFortyEightBitsOfTheTimestamp) {
    const Bytes blob = {0x01, 0x0D, 0x00, 0xC1, 0xB0, 0x34, 0x12, 0x90, 0x01, 0x10, 0x00, 0x00, 0x00, 0x00};
    EXPECT_EQ(ReplayPacer::timestampTicks(blob), std::optional<std::uint64_t>(0x100190));
    const Bytes prefixed = {0x81, 0x00, 0x01, 0x0D, 0x00, 0xC1, 0xB0, 0x00,
                            0x00, 0x90, 0x01, 0x10, 0x00, 0x00, 0x00, 0x00};
    EXPECT_EQ(ReplayPacer::timestampTicks(prefixed), std::optional<std::uint64_t>(0x100190));
    // Only the lower 16 bits set: no timestamp.
    const Bytes subTicks = {0xFF, 0x0D, 0x00, 0x01, 0x00, 0xFF, 0xFF, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00};
    EXPECT_EQ(ReplayPacer::timestampTicks(subTicks), std::nullopt);
    const Bytes shortPacket = {0x01, 0x0D, 0x00, 0xC1, 0xB0, 0x00, 0x00, 0x90, 0x01, 0x10, 0x00, 0x00};
    EXPECT_EQ(ReplayPacer::timestampTicks(shortPacket), std::nullopt);
    const Bytes otherType = {0x02, 0x0D, 0x00, 0xC1, 0xB0, 0x00, 0x00, 0x90, 0x01, 0x10, 0x00, 0x00, 0x00};
    EXPECT_EQ(ReplayPacer::timestampTicks(otherType), std::nullopt);
}

TEST(ReplayPacer, ReplaysTheRecordedGapsDividedByTheSpeed) {
    ReplayPacer pacer;
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart)), 0.0);
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart + 400)), 0.5);
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart + 400)), 0.5);
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart + 1200)), 1.5);

    ReplayPacer fourTimes(4.0);
    EXPECT_DOUBLE_EQ(fourTimes.next(packetAt(kStart)), 0.0);
    EXPECT_DOUBLE_EQ(fourTimes.next(packetAt(kStart + 400)), 0.125);
    EXPECT_DOUBLE_EQ(fourTimes.next(packetAt(kStart + 1200)), 0.375);
}

TEST(ReplayPacer, BlobsWithoutTimestampsGoFiftyPerSecond) {
    const Bytes bare = {0x01, 0x0E};
    ReplayPacer pacer;
    EXPECT_DOUBLE_EQ(pacer.next(bare), 0.0);
    EXPECT_DOUBLE_EQ(pacer.next(bare), 0.02);
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart)), 0.04);  // nothing to measure the gap from
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart + 80)), 0.14);
    EXPECT_DOUBLE_EQ(pacer.next(bare), 0.16);

    ReplayPacer doubled(2.0);
    EXPECT_DOUBLE_EQ(doubled.next(bare), 0.0);
    EXPECT_DOUBLE_EQ(doubled.next(bare), 0.01);
}

TEST(ReplayPacer, ClampsJumpsBackwardsAndLongGaps) {
    ReplayPacer pacer;
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart + 800)), 0.0);
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart)), 0.0);          // one second back: no wait
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart + 80)), 0.1);     // measured from the new clock
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart + 8080)), 3.1);   // ten seconds ahead: three
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart + 10480)), 6.1);  // three seconds exactly are kept
}

TEST(ReplayPacer, ANewRoundFollowsOneDefaultStepAfterTheLastBlob) {
    ReplayPacer pacer;
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart)), 0.0);
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart + 1600)), 2.0);
    pacer.newRound();
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart)), 2.02);
    EXPECT_DOUBLE_EQ(pacer.next(packetAt(kStart + 400)), 2.52);
}

}  // namespace
}  // namespace velmar
