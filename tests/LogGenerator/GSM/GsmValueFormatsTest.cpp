// The value formats the GSM/UMTS decoders use, rendered through ValueFormat: the integer and "%f" formats
// (written without snprintf) and others (through snprintf) must give exactly printf's text.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "LogGenerator/RecordFields.h"

namespace velmar {
namespace {

TEST(GsmValueFormats, IntegerFormatsWithAndWithoutSuffix) {
    EXPECT_EQ(asInt().render(0), "0");
    EXPECT_EQ(asInt().render(-5), "-5");
    EXPECT_EQ(asInt().render(2147483647), "2147483647");
    EXPECT_EQ(asInt().render(-2147483648LL), "-2147483648");
    // Raw 32-bit values of 2^31 and above are shown as "%d" shows them.
    EXPECT_EQ(asInt().render(0xFFFFFFFFLL), "-1");
    EXPECT_EQ(asInt("%d dBm").render(95), "95 dBm");
    EXPECT_EQ(asInt("%d dBm", 2).render(-40), "-80 dBm");
    EXPECT_EQ(asInt("%d dB", 1, -21).render(-64), "-85 dB");
    EXPECT_EQ(asInt("%d sec").render(6), "6 sec");
    EXPECT_EQ(asUnsigned().render(0xFFFFFFFFLL), "4294967295");
    EXPECT_EQ(asUnsigned("%u kbps").render(12), "12 kbps");
    EXPECT_EQ(asLong().render(-9000000000LL), "-9000000000");
    EXPECT_EQ(asInt("%d dBm").withSentinel(32767, "").render(32767), "");
}

TEST(GsmValueFormats, FixedDecimalFormat) {
    EXPECT_EQ(asDouble("%f dB", 0.5).render(-13), "-6.500000 dB");
    EXPECT_EQ(asDouble("%f dB", 0.5).render(3), "1.500000 dB");
    EXPECT_EQ(asDouble("%f dB", 0.5).render(0), "0.000000 dB");
    EXPECT_EQ(asDouble("%f").render(-128), "-128.000000");
    EXPECT_EQ(asDouble("%f", 1.0 / 3.0).render(1), "0.333333");
    EXPECT_EQ(asDouble("%f", 2.0 / 3.0).render(1), "0.666667");
}

TEST(GsmValueFormats, OtherFormatsGoThroughPrintf) {
    EXPECT_EQ(asDouble("%4.2f dBm", 0.25, -140).render(100), "-115.00 dBm");
    EXPECT_EQ(asInt("%+d dBm").render(7), "+7 dBm");
    EXPECT_EQ(asInt("%02d").render(7), "07");
    EXPECT_EQ(asInt("%d%%").render(50), "50%");
    EXPECT_EQ(asInt("[%d]").render(3), "[3]");
}

}  // namespace
}  // namespace velmar
