// Where the charts put their labels, and how they write numbers and spans.
#include "ui/ChartScale.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <limits>

#include "ui/ChartText.h"

namespace velmar {
namespace {

TEST(ChartScaleTest, ValueAxesStandOnRoundNumbers) {
    const AxisScale rsrp = niceScale(-112.25, -65.5, 7);
    EXPECT_EQ(rsrp.low, -120.0);
    EXPECT_EQ(rsrp.high, -60.0);
    EXPECT_EQ(rsrp.step, 10.0);
    EXPECT_EQ(rsrp.ticks, 7);
    EXPECT_EQ(rsrp.decimals(), 0);

    // Steps of 1, 2 and 2.5 would need 17, 9 and 8 labels: 5 it is.
    const AxisScale rsrq = niceScale(-19.6, -4.1, 7);
    EXPECT_EQ(rsrq.step, 5.0);
    EXPECT_EQ(rsrq.low, -20.0);
    EXPECT_EQ(rsrq.high, 0.0);
    EXPECT_EQ(rsrq.ticks, 5);
    const AxisScale quarter = niceScale(-19.6, -4.1, 8);
    EXPECT_EQ(quarter.step, 2.5);
    EXPECT_EQ(quarter.ticks, 8);
    EXPECT_EQ(quarter.decimals(), 1);
}

TEST(ChartScaleTest, TheStepGrowsUntilTheLabelsFit) {
    for (int maxTicks = 3; maxTicks <= 11; ++maxTicks) {
        for (const auto& [low, high] : {std::pair{-140.0, -44.0},
                                        {0.0, 1.0},
                                        {-0.3, 0.7},
                                        {1300.0, 1301.0},
                                        {-1342111658.0, 27555075.0},
                                        {3.1, 3.15}}) {
            const AxisScale scale = niceScale(low, high, maxTicks);
            EXPECT_LE(scale.ticks, maxTicks) << low << " " << high;
            EXPECT_GE(scale.ticks, 2);
            EXPECT_LE(scale.low, low);
            EXPECT_GE(scale.high, high);
            EXPECT_NEAR(scale.low + scale.step * (scale.ticks - 1), scale.high,
                        1e-9 * std::abs(scale.high) + 1e-12);
        }
    }
}

TEST(ChartScaleTest, AFlatRangeOpensAroundItsValue) {
    const AxisScale flat = niceScale(-124.0, -124.0, 5);
    EXPECT_LT(flat.low, -124.0);
    EXPECT_GT(flat.high, -124.0);
    const AxisScale zero = niceScale(0.0, 0.0, 5);
    EXPECT_LE(zero.low, -1.0);
    EXPECT_GE(zero.high, 1.0);
}

TEST(ChartScaleTest, DecimalsWriteTheStepExactly) {
    EXPECT_EQ((AxisScale{0, 10, 2.5, 5}).decimals(), 1);
    EXPECT_EQ((AxisScale{0, 1, 0.25, 5}).decimals(), 2);
    EXPECT_EQ((AxisScale{0, 100, 25, 5}).decimals(), 0);
    EXPECT_EQ((AxisScale{0, 1, 0.1, 11}).decimals(), 1);
    EXPECT_EQ((AxisScale{0, 0.01, 0.002, 6}).decimals(), 3);
}

TEST(ChartScaleTest, TimeTicksFallOnRoundLocalClockTimes) {
    setenv("TZ", "UTC", 1);
    tzset();
    // 2026-09-22 14:03:17 UTC, ten minutes.
    const double end = 1790085797.0;
    const TimeTicks ticks = timeTicks(end - 600.0, end, 4);
    EXPECT_EQ(ticks.step, 300.0);
    EXPECT_STREQ(ticks.format, "%H:%M");
    ASSERT_EQ(ticks.instants.size(), 2u);
    EXPECT_EQ(ticks.instants[0], 1790085300.0);  // 13:55
    EXPECT_EQ(ticks.instants[1], 1790085600.0);  // 14:00

    const TimeTicks seconds = timeTicks(end - 60.0, end, 12);
    EXPECT_EQ(seconds.step, 5.0);
    EXPECT_STREQ(seconds.format, "%H:%M:%S");
    EXPECT_EQ(seconds.instants.front(), end - 57.0);
    EXPECT_EQ(seconds.instants.size(), 12u);

    // In a zone half an hour off the hour, the ticks still fall on its round times.
    setenv("TZ", "Asia/Kolkata", 1);
    tzset();
    const TimeTicks india = timeTicks(end - 3600.0, end, 4);
    EXPECT_EQ(india.step, 900.0);
    for (const double instant : india.instants) {
        EXPECT_EQ(std::fmod(instant + 19800.0, 900.0), 0.0);
    }
    setenv("TZ", "UTC", 1);
    tzset();
}

TEST(ChartScaleTest, HostileSpansGiveFewTicksAndNoLoop) {
    EXPECT_TRUE(timeTicks(100.0, 50.0, 5).instants.empty());
    EXPECT_LE(timeTicks(0.0, 1e12, 5).instants.size(), 7u);
    EXPECT_TRUE(timeTicks(0.0, std::numeric_limits<double>::infinity(), 5).instants.empty());
    const AxisScale nan = niceScale(std::numeric_limits<double>::quiet_NaN(), 1.0, 5);
    EXPECT_EQ(nan.ticks, 2);
}

TEST(ChartTextTest, ReadingsWithTheDecimalsOfTheDisplayAndTheirUnit) {
    EXPECT_EQ(formatReading(-101.25, 2, ""), "-101.25");
    EXPECT_EQ(formatReading(-65.5, 2, "dBm"), "-65.50 dBm");
    EXPECT_EQ(formatReading(60.0, 0, ""), "60");
    EXPECT_EQ(formatReading(-10.875, 2, "dB"), "-10.88 dB");
    EXPECT_EQ(formatReading(3.1, 2, "%"), "3.10%");
    EXPECT_EQ(formatReading(-0.001, 2, "dB"), "0.00 dB");
    EXPECT_EQ(formatReading(-0.4, 0, ""), "0");
    EXPECT_EQ(formatReading(-0.5, 1, ""), "-0.5");
    EXPECT_EQ(formatReading(168, 0, "\xC3\x97 64chips"), "168 \xC3\x97 64chips");
    EXPECT_EQ(formatReading(1263206400.0, 0, "sec"), "1263206400 sec");
    // Out-of-range decimals are held to what a double can show.
    EXPECT_EQ(formatReading(1.5, -3, ""), "2");
    EXPECT_EQ(formatReading(0.25, 40, ""), "0.250000000");
}

TEST(ChartTextTest, Spans) {
    EXPECT_EQ(formatSpan(600.0), "10 min");
    EXPECT_EQ(formatSpan(3600.0), "60 min");
    EXPECT_EQ(formatSpan(60.0), "1 min");
    EXPECT_EQ(formatSpan(45.0), "45 s");
}

}  // namespace
}  // namespace velmar
