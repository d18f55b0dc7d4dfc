// Which display values read as numbers: every value format the decoders print, made with the very printf
// formats they use, and the texts and value-table names that must not.
#include "core/NumericValue.h"

#include <gtest/gtest.h>

#include <cmath>
#include <string>

#include "core/platform/StringFormat.h"

namespace velmar {
namespace {

void expectNumber(const std::string& text, double value, std::string_view unit) {
    const std::optional<NumericValue> parsed = parseNumericValue(text);
    ASSERT_TRUE(parsed) << '"' << text << '"';
    EXPECT_EQ(parsed->value, value) << '"' << text << '"';
    EXPECT_EQ(parsed->unit, unit) << '"' << text << '"';
}

TEST(NumericValueTest, IntegerFormats) {
    expectNumber(stringWithFormat("%d", 42), 42, "");
    expectNumber(stringWithFormat("%d", -1342111658), -1342111658, "");
    expectNumber(stringWithFormat("%d", 0), 0, "");
    expectNumber(stringWithFormat("%u", 4000000000u), 4000000000.0, "");
    expectNumber(stringWithFormat("%ld", 1263206400L), 1263206400, "");
    expectNumber(stringWithFormat("%d", 999999999), 999999999, "");
    expectNumber(stringWithFormat("%d dBm", -85), -85, "dBm");
    expectNumber(stringWithFormat("%d dBm", 60), 60, "dBm");
    expectNumber(stringWithFormat("%d dB", -159), -159, "dB");
    expectNumber(stringWithFormat("%+d dBm", 5), 5, "dBm");
    expectNumber(stringWithFormat("%+d dBm", -12), -12, "dBm");
    expectNumber(stringWithFormat("%d sec", 4), 4, "sec");
    expectNumber(stringWithFormat("%d \xC3\x97 64chips", 168), 168, "\xC3\x97 64chips");
}

TEST(NumericValueTest, FixedPointFormats) {
    expectNumber(stringWithFormat("%4.2f dBm", -99.75), -99.75, "dBm");
    expectNumber(stringWithFormat("%4.2f dBm", 5.0), 5.0, "dBm");  // padded: " 5.00 dBm" is 4 wide
    expectNumber(stringWithFormat("%4.2lf dBm", -140.0), -140.0, "dBm");
    expectNumber(stringWithFormat("%4.2f dB", -10.88), -10.88, "dB");
    expectNumber(stringWithFormat("%4.2f", 3.5), 3.5, "");
    expectNumber(stringWithFormat("%.2f", 0.25), 0.25, "");
    expectNumber(stringWithFormat("%f", 0.5), 0.5, "");
    expectNumber(stringWithFormat("%f dB", -3.25), -3.25, "dB");
    expectNumber(stringWithFormat("%+.2f dBm", -72.6), -72.6, "dBm");
    expectNumber(stringWithFormat("%+.2f dB", 0.0), 0.0, "dB");
    expectNumber(stringWithFormat("%+.2f dB", 8.39), 8.39, "dB");
    expectNumber(stringWithFormat("%.2f kbps", 3.5), 3.5, "kbps");
    expectNumber(stringWithFormat("%.02f%%", 3.1), 3.1, "%");
    // A negative zero is a zero.
    const auto zero = parseNumericValue(stringWithFormat("%4.2f dB", -0.0));
    ASSERT_TRUE(zero);
    EXPECT_FALSE(std::signbit(zero->value));
    expectNumber(stringWithFormat("%f", 123456789012345.0), 123456789012345.0, "");
    expectNumber("000000000000000012.5", 12.5, "");  // leading zeros are not significant
}

TEST(NumericValueTest, DecimalsAsPrinted) {
    EXPECT_EQ(parseNumericValue(stringWithFormat("%4.2f dBm", -65.5)).value().decimals, 2);
    EXPECT_EQ(parseNumericValue(stringWithFormat("%d dBm", -85)).value().decimals, 0);
    EXPECT_EQ(parseNumericValue(stringWithFormat("%f", 0.5)).value().decimals, 6);
    EXPECT_EQ(parseNumericValue(stringWithFormat("%.02f%%", 3.1)).value().decimals, 2);
    EXPECT_EQ(parseNumericValue("(ref pilot) +10.0 dB").value().decimals, 1);
}

TEST(NumericValueTest, RemarksInParenthesesAreLeftOut) {
    expectNumber(stringWithFormat("%.02f%% (old)", 1.56), 1.56, "%");
    expectNumber(stringWithFormat("(ref pilot) %+.2f dB", 10.0), 10.0, "dB");
    expectNumber(stringWithFormat("(ref pilot) %+.2f dB", -18.06), -18.06, "dB");
}

TEST(NumericValueTest, BlanksAroundTheValueAreTrimmed) {
    // "%c%c%c" of a two-digit network code ends in a blank.
    expectNumber(stringWithFormat("%c%c%c", '4', '1', ' '), 41, "");
    expectNumber("  -99.75 dBm  ", -99.75, "dBm");
}

TEST(NumericValueTest, TextsThatAreNotNumbers) {
    for (const std::string_view text : {"",
                                        " ",
                                        "Not Present",
                                        "N/A",
                                        "Unknown",
                                        "Invalid Value",
                                        "(unknown)",
                                        "True",
                                        "FALSE",
                                        "REG_STATE_IDLE",
                                        "-",
                                        "+",
                                        ".5",
                                        "12.",
                                        "1e5",
                                        "nan",
                                        "-nan",
                                        "inf",
                                        "-inf",
                                        "1,5",
                                        "5dBm",
                                        "5  dBm",
                                        "5 dbm",
                                        "5 %",
                                        "5 dBm extra",
                                        "12 34",
                                        "--5",
                                        "+-5",
                                        "\xE2\x88\x92"
                                        "5"}) {
        EXPECT_FALSE(parseNumericValue(text)) << '"' << text << '"';
    }
}

TEST(NumericValueTest, RawValueFormatsThatAreNotNumbers) {
    for (const std::string& text :
         {stringWithFormat("0x%06x", 0x0a1b2c), stringWithFormat("[Reserved %d]", 3),
          stringWithFormat("[%d]", 7), stringWithFormat("[Bad Value %d]", 9),
          stringWithFormat("ERI - %d", 13), stringWithFormat("(unknown system type %d)", 4),
          stringWithFormat("%d;%d", 1, 300), stringWithFormat("Connected [%d]", 5),
          stringWithFormat("%c%c%c", '3', '1', 'F')}) {
        EXPECT_FALSE(parseNumericValue(text)) << '"' << text << '"';
    }
}

TEST(NumericValueTest, ValueTableNamesThatBeginWithDigitsAreNotNumbers) {
    for (const std::string_view text :
         {"10 MHz", "1.4 MHz", "500 ms", "0 ms", "1 to 3", "11-bit format", "8-bit format", "Class 2", "NC1",
          "1.8 to 2.0GHz PCS band [1]", "800 MHz cellular band [0]", "30 minutes", "10.0.0.2", "001-01",
          "IPv4", "2G", "1/2"}) {
        EXPECT_FALSE(parseNumericValue(text)) << '"' << text << '"';
    }
}

TEST(NumericValueTest, IdentitiesMadeOfDigitsAreNotNumbers) {
    // A SIM's ICCID, and anything longer than a double holds exactly.
    EXPECT_FALSE(parseNumericValue("89001012012345678905"));
    EXPECT_FALSE(parseNumericValue("1234567890123456"));
    EXPECT_FALSE(parseNumericValue(stringWithFormat("%f", 1e300)));
    EXPECT_FALSE(parseNumericValue("-1" + std::string(400, '0') + " dBm"));
    // A subscriber number with its international prefix: a "+" comes with a unit in our formats.
    EXPECT_FALSE(parseNumericValue("+15555550123"));
    EXPECT_FALSE(parseNumericValue("+5"));
}

}  // namespace
}  // namespace velmar
