#include <gtest/gtest.h>

#include <cstdio>

#include "LogGenerator/LTE/LteFormats.h"

namespace velmar {
namespace {

std::string printed(const char* format, double value) {
    char text[64];
    std::snprintf(text, sizeof text, format, value);
    return text;
}

// The LTE level conversions give the C library's own text for every 16-bit raw value, exact ties included
// (x.125 rounds to x.12, x.875 to x.88).
TEST(LteFormats, LevelsPrintAsTheCLibraryPrintsThem) {
    const struct {
        const ValueFormat& format;
        const char* printfFormat;
        double scale;
        double bias;
    } cases[] = {
        {lte_formats::kQuarterDbRsrp, "%4.2f dBm", 0.25, -140.0},
        {lte_formats::kEighthDbRsrq, "%4.2f dB", 0.125, -20.0},
        {lte_formats::kQuarterDbRsrq, "%4.2f dB", 0.25, -30.0},
        {lte_formats::kHalfDbLevel, "%4.2f dBm", 0.5, -140.0},
    };
    for (const auto& item : cases) {
        for (std::int64_t raw = 0; raw <= 0xFFFF; ++raw) {
            const std::string expected =
                printed(item.printfFormat, static_cast<double>(raw) * item.scale + item.bias);
            ASSERT_EQ(item.format.render(raw), expected) << item.printfFormat << " raw " << raw;
        }
    }
    EXPECT_EQ(lte_formats::kEighthDbRsrq.render(161), "0.12 dB");   // 0.125
    EXPECT_EQ(lte_formats::kEighthDbRsrq.render(167), "0.88 dB");   // 0.875
    EXPECT_EQ(lte_formats::kEighthDbRsrq.render(163), "0.38 dB");   // 0.375
    EXPECT_EQ(lte_formats::kEighthDbRsrq.render(159), "-0.12 dB");  // -0.125
}

TEST(LteFormats, WidthPadsShortTextWithBlanks) {
    EXPECT_EQ(asDouble("%6.1f|", 1.0).render(5), "   5.0|");
    EXPECT_EQ(asDouble("%4.2f", 0.25).render(0), "0.00");
    EXPECT_EQ(asDouble("%.0f", 0.5).render(5), "2");  // 2.5 to even
    EXPECT_EQ(asDouble("%f", 1.0 / 256.0).render(195), "0.761719");
    // Flags and other conversions keep the C library's text.
    EXPECT_EQ(asDouble("%07.2f", 1.0).render(3), "0003.00");
    EXPECT_EQ(asDouble("%-6.1f|", 1.0).render(3), "3.0   |");
    EXPECT_EQ(asDouble("%e", 1.0).render(3), "3.000000e+00");
}

}  // namespace
}  // namespace velmar
