// Units of velmar-decode seen from inside: the clock of refreshes by recording time and the progress line.
#include <gtest/gtest.h>

#include <cstdio>
#include <vector>

#include "tools/decode/ProgressLine.h"
#include "tools/decode/RecordingClock.h"

namespace velmar {
namespace {

constexpr std::int64_t kSecond = 1000000;

TEST(RecordingClock, RefreshesAtTheEndOfEachPeriodThatHoldsPackets) {
    RecordingClock clock(2 * kSecond);
    const std::int64_t base = 1714564800 * kSecond;
    EXPECT_EQ(clock.currentPeriodEnd(), std::nullopt);
    EXPECT_EQ(clock.refreshBefore(base + kSecond / 2), std::nullopt);
    EXPECT_EQ(clock.currentPeriodEnd(), base + 2 * kSecond);
    EXPECT_EQ(clock.refreshBefore(base + 2 * kSecond - 1), std::nullopt);
    EXPECT_EQ(clock.refreshBefore(base + 2 * kSecond), base + 2 * kSecond);  // a period ends where it ends
    // Ten empty periods later: one refresh, for the period that held packets.
    EXPECT_EQ(clock.refreshBefore(base + 25 * kSecond), base + 4 * kSecond);
    EXPECT_EQ(clock.currentPeriodEnd(), base + 26 * kSecond);
    // Back in time (a badly stamped packet, another subscription's late one): the clock stays.
    EXPECT_EQ(clock.refreshBefore(315964800 * kSecond + kSecond), std::nullopt);
    EXPECT_EQ(clock.refreshBefore(base + 10 * kSecond), std::nullopt);
    EXPECT_EQ(clock.currentPeriodEnd(), base + 26 * kSecond);
    EXPECT_EQ(clock.refreshBefore(base + 26 * kSecond + 1), base + 26 * kSecond);
}

TEST(RecordingClock, PeriodsFallOnMultiplesOfThePeriodSince1970) {
    RecordingClock clock(kSecond * 3 / 2);
    EXPECT_EQ(clock.refreshBefore(10 * kSecond), std::nullopt);
    EXPECT_EQ(clock.currentPeriodEnd(), 10 * kSecond + kSecond / 2);  // 7 × 1.5 s
    RecordingClock early(2 * kSecond);
    EXPECT_EQ(early.refreshBefore(-3 * kSecond), std::nullopt);  // floor division before 1970
    EXPECT_EQ(early.currentPeriodEnd(), -2 * kSecond);
}

TEST(ProgressLine, TellsBytesPacketsRateAndTimeLeft) {
    EXPECT_EQ(ProgressLine::text("big.qmdl", 100'000'000, 277'337'900, 1'234'567, 2.0),
              "big.qmdl: 100.0 of 277.3 MB, 1,234,567 packets, 50.0 MB/s, 0:04 left");
    EXPECT_EQ(ProgressLine::text("big.qmdl", 0, 60'000'000, 0, 0.0),
              "big.qmdl: 0.0 of 60.0 MB, 0 packets, 0.0 MB/s");
    EXPECT_EQ(ProgressLine::text("x.dlf", 10'000'000, 7'010'000'000, 999, 1.0),
              "x.dlf: 10.0 of 7010.0 MB, 999 packets, 10.0 MB/s, 11:40 left");
}

TEST(ProgressLine, StaysSilentWhereItMustNotShow) {
    // Not a terminal: a pipe-like file; and a terminal-less small input. Nothing is written either way.
    std::FILE* out = std::tmpfile();
    ASSERT_NE(out, nullptr);
    {
        ProgressLine progress(out, "/dev/zero");
        EXPECT_FALSE(progress.shown());
        for (int i = 0; i < 10000; ++i) {
            progress.update(static_cast<std::uint64_t>(i) * 1000, static_cast<std::uint64_t>(i));
        }
    }
    EXPECT_EQ(std::ftell(out), 0L);
    std::fclose(out);
}

}  // namespace
}  // namespace velmar
