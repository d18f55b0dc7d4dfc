#include "LogGenerator/RecordFields.h"

#include <gtest/gtest.h>

namespace velmar {
namespace {

TEST(RecordReader, FieldsPastTheEndReadAsZero) {
    const std::vector<std::uint8_t> bytes{0x34, 0x12, 0xFF};
    const RecordReader reader(bytes);
    EXPECT_EQ(reader.u16(0), 0x1234u);
    EXPECT_EQ(reader.u16(2), 0x00FFu);  // half past the end
    EXPECT_EQ(reader.u32(1), 0x0000FF12u);
    EXPECT_EQ(reader.u32(1000), 0u);
    EXPECT_EQ(reader.u8(static_cast<std::size_t>(-1)), 0u);
    EXPECT_EQ(reader.s8(2), -1);
    EXPECT_EQ(reader.s16(1), static_cast<std::int16_t>(0xFF12));
}

TEST(RecordReader, BothByteOrdersAndSignExtension) {
    const std::vector<std::uint8_t> bytes{0x80, 0x01, 0x02};
    const RecordReader reader(bytes);
    EXPECT_EQ(reader.unsignedBE(0, 3), 0x800102u);
    EXPECT_EQ(reader.signedBE(0, 3), -0x7FFEFE);
    EXPECT_EQ(reader.u24(0), 0x020180u);
    EXPECT_EQ(reader.signedLE(0, 1), -128);
}

TEST(RecordReader, BitFieldsSpanBytes) {
    // bits 7..13 of bytes 0..1: byte0 = 0b1000'0000, byte1 = 0b0011'1111 → value 0b111'1111 = 127.
    const std::vector<std::uint8_t> bytes{0x80, 0x3F, 0xFF};
    const RecordReader reader(bytes);
    EXPECT_EQ(reader.bits(0, 2, 7, 13), 127u);
    EXPECT_EQ(reader.bits(0, 1, 7, 7), 1u);
    EXPECT_EQ(reader.bits(1, 2, 0, 15), 0xFF3Fu);
    EXPECT_EQ(reader.bits(2, 2, 0, 15), 0x00FFu);  // one byte past the end reads zero
}

constexpr ValueName kModeRows[] = {{0, 0, "Class 1"}, {1, 1, "Class 2"}, {2, 2, "Class 3"}};
constexpr ValueNames kModes{kModeRows, "Unknown"};
constexpr ValueName kReservedRows[] = {{0, 3, "Low"}, {255, 255, "Not Available"}};
constexpr ValueNames kReserved{kReservedRows, "[Reserved %d]"};

TEST(ValueFormat, RendersEveryKind) {
    EXPECT_EQ(asInt().render(-5), "-5");
    EXPECT_EQ(asInt("%d dBm").render(95), "95 dBm");
    EXPECT_EQ(asInt("%d dB", 1, -21).render(-64), "-85 dB");
    EXPECT_EQ(asInt().render(0xFFFFFFFFll), "-1");  // 32-bit fields through "%d"
    EXPECT_EQ(asUnsigned().render(0xFFFFFFFFll), "4294967295");
    EXPECT_EQ(asDouble("%4.2f dBm", 0.25, -140.0).render(0), "-140.00 dBm");
    EXPECT_EQ(asDouble("%4.2f dB", 0.125, -20.0).render(160), "0.00 dB");
    EXPECT_EQ(asDouble("%f dB", 0.5).render(-13), "-6.500000 dB");
    EXPECT_EQ(asInt("%d dBm", 1, -30).withSentinel(64, "Not Present").render(64), "Not Present");
    EXPECT_EQ(asInt("%d dBm", 1, -30).withSentinel(64, "Not Present").render(63), "33 dBm");
    EXPECT_EQ(asName(kModes).render(1), "Class 2");
    EXPECT_EQ(asName(kModes).render(3), "Unknown");
    EXPECT_EQ(asName(kReserved).render(2), "Low");
    EXPECT_EQ(asName(kReserved).render(255), "Not Available");
    EXPECT_EQ(asName(kReserved).render(9), "[Reserved 9]");
}

constexpr RecordField kLayout[] = {
    u16Field(17, "Cell ID"),
    u16Field(13, "ARFCN"),
    s8Field(15, "RSSI", asInt("%d dBm")),
    bitField(16, 1, 4, 7, "High nibble"),
    u8Field(30, "Past the end"),
};

TEST(RecordFields, WalkerWritesKeysInTableOrder) {
    std::vector<std::uint8_t> record(19, 0);
    record[13] = 0x0A;
    record[15] = 0xB0;  // -80
    record[16] = 0xC3;
    record[17] = 0x39;
    record[18] = 0x30;
    const RecordReader reader(record);
    auto section = PlistDictionary::create();
    section->set("ARFCN", "old");
    section->set("Kept", "yes");
    writeFields(kLayout, reader, 0, *section);
    std::vector<std::pair<std::string, std::string>> written;
    for (const auto& [key, value] : *section) {
        written.emplace_back(key, *value.string());
    }
    const std::vector<std::pair<std::string, std::string>> expected{
        {"ARFCN", "10"},     {"Kept", "yes"},       {"Cell ID", "12345"},
        {"RSSI", "-80 dBm"}, {"High nibble", "12"}, {"Past the end", "0"}};
    EXPECT_EQ(written, expected);
}

TEST(RecordFields, RowsReadRelativeToTheirBase) {
    const std::vector<std::uint8_t> record{0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0x01, 0x02};
    constexpr RecordField kEntry[] = {u16Field(0, "Value")};
    const PlistDictionaryRef row = rowFromFields(kEntry, RecordReader(record), 17);
    EXPECT_EQ(*row->get("Value").string(), "513");
}

}  // namespace
}  // namespace velmar
