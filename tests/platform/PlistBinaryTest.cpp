// The binary encoding: hand-assembled documents read by parsePropertyList, exact bytes from serializeBinary,
// and round trips of every kind of value.
#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <initializer_list>
#include <limits>
#include <string>
#include <vector>

#include "core/platform/plist/PlistCodec.h"

namespace velmar {
namespace {

using Bytes = std::vector<std::uint8_t>;

PlistValue dictionaryOf(std::initializer_list<std::pair<std::string_view, PlistValue>> entries) {
    auto dictionary = PlistDictionary::create();
    for (const auto& [key, value] : entries) {
        dictionary->set(key, value);
    }
    return PlistValue(dictionary);
}

PlistValue arrayOf(std::initializer_list<PlistValue> items) {
    return PlistValue(PlistArray::create(items));
}

void append(Bytes& out, std::initializer_list<std::uint8_t> bytes) {
    out.insert(out.end(), bytes);
}

void appendBigEndian(Bytes& out, std::uint64_t value, int width) {
    for (int i = width - 1; i >= 0; --i) {
        out.push_back(static_cast<std::uint8_t>(value >> (8 * i)));
    }
}

// A document of the given objects (marker and contents each) with one-byte references: object i is at the
// i-th offset, object 0 is the top.
Bytes assemble(const std::vector<Bytes>& objects) {
    Bytes out = {'b', 'p', 'l', 'i', 's', 't', '0', '0'};
    std::vector<std::uint64_t> offsets;
    for (const Bytes& object : objects) {
        offsets.push_back(out.size());
        out.insert(out.end(), object.begin(), object.end());
    }
    const std::uint64_t table = out.size();
    const int width = table > 0xFF ? 4 : 1;
    for (const auto offset : offsets) {
        appendBigEndian(out, offset, width);
    }
    append(out, {0, 0, 0, 0, 0, 0, static_cast<std::uint8_t>(width), 1});
    appendBigEndian(out, objects.size(), 8);
    appendBigEndian(out, 0, 8);
    appendBigEndian(out, table, 8);
    return out;
}

std::optional<PlistValue> parseBytes(const Bytes& bytes, std::string* error = nullptr) {
    return parsePropertyList(bytes, error);
}

// Byte tables laid out one object per line.
// clang-format off

// {"a": 1}, written out by hand.
const Bytes kDictionaryFixture = {
    'b', 'p', 'l', 'i', 's', 't', '0', '0',
    0xD1, 0x01, 0x02,  // offset 8: dictionary of one entry, key object 1, value object 2
    0x51, 'a',         // offset 11: ASCII string of one character
    0x10, 0x01,        // offset 13: one-byte integer 1
    0x08, 0x0B, 0x0D,  // offset 15: offset table
    0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x01, 0x01,  // trailer: unused, offset size 1, reference size 1
    0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x03,  // three objects
    0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00,  // top object 0
    0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x0F,  // offset table at 15
};

// ["Grüße", "𝄞", 2.5f, 2026-03-04T05:06:07Z, true], written out by hand.
const Bytes kArrayFixture = {
    'b', 'p', 'l', 'i', 's', 't', '0', '0',
    0xA5, 0x01, 0x02, 0x03, 0x04, 0x05,                                // offset 8: array of five
    0x65, 0x00, 0x47, 0x00, 0x72, 0x00, 0xFC, 0x00, 0xDF, 0x00, 0x65,  // offset 14: UTF-16BE "Grüße"
    0x62, 0xD8, 0x34, 0xDD, 0x1E,                                      // offset 25: surrogate pair, U+1D11E
    0x22, 0x40, 0x20, 0x00, 0x00,                                      // offset 30: 4-byte real 2.5
    0x33, 0x41, 0xC7, 0xAB, 0xFA, 0x9F, 0x80, 0x00, 0x00,              // offset 35: date, 2001 + 794293567 s
    0x09,                                                              // offset 44: true
    0x08, 0x0E, 0x19, 0x1E, 0x23, 0x2C,                                // offset 45: offset table
    0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x01, 0x01,                    // trailer: widths 1 and 1
    0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x06,                    // six objects
    0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00,                    // top object 0
    0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00, 0x2D,                    // offset table at 45
};

// clang-format on

TEST(PlistBinaryReader, ReadsHandWrittenDictionary) {
    std::string error;
    const auto value = parseBytes(kDictionaryFixture, &error);
    ASSERT_TRUE(value) << error;
    EXPECT_EQ(*value, dictionaryOf({{"a", PlistValue::integer(1)}}));
}

TEST(PlistBinaryReader, ReadsHandWrittenArrayWithUtf16Strings) {
    std::string error;
    const auto value = parseBytes(kArrayFixture, &error);
    ASSERT_TRUE(value) << error;
    EXPECT_EQ(*value, arrayOf({"Grüße", "\xF0\x9D\x84\x9E", PlistValue::real(2.5),
                               PlistValue::date(PlistDate{1772600767}), PlistValue::boolean(true)}));
}

TEST(PlistBinaryWriter, WritesTheSmallDictionaryByteForByte) {
    const auto bytes = serializeBinary(dictionaryOf({{"a", PlistValue::integer(1)}}));
    ASSERT_TRUE(bytes);
    EXPECT_EQ(*bytes, kDictionaryFixture);
}

TEST(PlistBinaryWriter, WritesNonAsciiTextAsUtf16) {
    const auto bytes = serializeBinary(PlistValue("é𝄞"));
    ASSERT_TRUE(bytes);
    Bytes expected = {'b', 'p', 'l', 'i', 's', 't', '0', '0', 0x63, 0x00, 0xE9, 0xD8, 0x34, 0xDD, 0x1E, 0x08};
    append(expected, {0, 0, 0, 0, 0, 0, 1, 1});
    appendBigEndian(expected, 1, 8);
    appendBigEndian(expected, 0, 8);
    appendBigEndian(expected, 15, 8);
    EXPECT_EQ(*bytes, expected);
}

// The bytes of the single object of a one-value document.
Bytes objectBytes(const PlistValue& value) {
    const auto bytes = serializeBinary(value);
    if (!bytes || bytes->size() < 8 + 1 + 32) {
        return {};
    }
    const std::size_t table = (*bytes)[bytes->size() - 1];
    return Bytes(bytes->begin() + 8, bytes->begin() + static_cast<std::ptrdiff_t>(table));
}

TEST(PlistBinaryWriter, UsesTheSmallestIntegerWidth) {
    EXPECT_EQ(objectBytes(PlistValue::integer(0)), (Bytes{0x10, 0x00}));
    EXPECT_EQ(objectBytes(PlistValue::integer(255)), (Bytes{0x10, 0xFF}));
    EXPECT_EQ(objectBytes(PlistValue::integer(256)), (Bytes{0x11, 0x01, 0x00}));
    EXPECT_EQ(objectBytes(PlistValue::integer(65536)), (Bytes{0x12, 0x00, 0x01, 0x00, 0x00}));
    EXPECT_EQ(objectBytes(PlistValue::integer(0x100000000)),
              (Bytes{0x13, 0x00, 0x00, 0x00, 0x01, 0x00, 0x00, 0x00, 0x00}));
    EXPECT_EQ(objectBytes(PlistValue::integer(-1)),
              (Bytes{0x13, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF}));
    EXPECT_EQ(objectBytes(PlistValue::real(1.0)), (Bytes{0x23, 0x3F, 0xF0, 0, 0, 0, 0, 0, 0}));
    EXPECT_EQ(objectBytes(PlistValue::date(PlistDate{978307200})), (Bytes{0x33, 0, 0, 0, 0, 0, 0, 0, 0}));
    EXPECT_EQ(objectBytes(PlistValue::boolean(false)), (Bytes{0x08}));
    EXPECT_EQ(objectBytes(PlistValue::data({1, 2})), (Bytes{0x42, 0x01, 0x02}));
    // Fifteen characters and more take a separate length.
    EXPECT_EQ(
        objectBytes(PlistValue("abcdefghijklmno")),
        (Bytes{0x5F, 0x10, 0x0F, 'a', 'b', 'c', 'd', 'e', 'f', 'g', 'h', 'i', 'j', 'k', 'l', 'm', 'n', 'o'}));
}

TEST(PlistBinaryReader, ReadsSixteenByteIntegersThatFit) {
    Bytes positive = {0x14};
    appendBigEndian(positive, 0, 8);
    appendBigEndian(positive, 0x7FFFFFFFFFFFFFFF, 8);
    auto value = parseBytes(assemble({positive}));
    ASSERT_TRUE(value);
    EXPECT_EQ(value->integerValue(), std::numeric_limits<std::int64_t>::max());

    Bytes negative = {0x14};
    appendBigEndian(negative, ~std::uint64_t{0}, 8);
    appendBigEndian(negative, static_cast<std::uint64_t>(-5), 8);
    value = parseBytes(assemble({negative}));
    ASSERT_TRUE(value);
    EXPECT_EQ(value->integerValue(), -5);

    Bytes tooLarge = {0x14};
    appendBigEndian(tooLarge, 0, 8);
    appendBigEndian(tooLarge, 0x8000000000000000, 8);
    std::string error;
    EXPECT_FALSE(parseBytes(assemble({tooLarge}), &error));
    EXPECT_EQ(error, "offset 8: integer does not fit in 64 bits");
}

TEST(PlistBinaryReader, ReadsUnsignedNarrowIntegersAndSignedWideOnes) {
    auto value = parseBytes(assemble({{0x12, 0xFF, 0xFF, 0xFF, 0xFF}}));
    ASSERT_TRUE(value);
    EXPECT_EQ(value->integerValue(), 4294967295);
    value = parseBytes(assemble({{0x13, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFF, 0xFE}}));
    ASSERT_TRUE(value);
    EXPECT_EQ(value->integerValue(), -2);
}

PlistValue everyKind() {
    PlistData bytes;
    for (int i = 0; i < 300; ++i) {
        bytes.push_back(static_cast<std::uint8_t>(i * 13));
    }
    return dictionaryOf({
        {"text", "plain ascii"},
        {"unicode", "Grüße ✓ 𝄞"},
        {"long", "a string that is longer than fourteen characters"},
        {"empty", ""},
        {"nul", PlistValue(std::string("a\0b", 3))},
        {"negative", PlistValue::integer(-42)},
        {"zero", PlistValue::integer(0)},
        {"largest", PlistValue::integer(std::numeric_limits<std::int64_t>::max())},
        {"smallest", PlistValue::integer(std::numeric_limits<std::int64_t>::min())},
        {"real", PlistValue::real(3.25)},
        {"third", PlistValue::real(1.0 / 3.0)},
        {"negativeZero", PlistValue::real(-0.0)},
        {"infinity", PlistValue::real(std::numeric_limits<double>::infinity())},
        {"yes", PlistValue::boolean(true)},
        {"no", PlistValue::boolean(false)},
        {"data", PlistValue::data(bytes)},
        {"emptyData", PlistValue::data({})},
        {"date", PlistValue::date(PlistDate{1772600767})},
        {"early", PlistValue::date(PlistDate{-62135596800})},
        {"fraction", PlistValue::date(PlistDate{978307200.5})},
        {"list", arrayOf({PlistValue::integer(1), "two", arrayOf({}), dictionaryOf({})})},
        {"ünïcode key", dictionaryOf({{"z", "last"}, {"a", "first"}})},
    });
}

TEST(PlistBinaryWriter, RoundTripsEveryKind) {
    const PlistValue value = everyKind();
    const auto bytes = serializeBinary(value);
    ASSERT_TRUE(bytes);
    std::string error;
    const auto back = parsePropertyList(*bytes, &error);
    ASSERT_TRUE(back) << error;
    EXPECT_EQ(*back, value);
    // Dictionary order survives, in the root and below it.
    const auto& entries = back->dictionary()->entries();
    ASSERT_EQ(entries.size(), value.dictionary()->size());
    EXPECT_EQ(entries.front().first, "text");
    EXPECT_EQ(entries.back().first, "ünïcode key");
    EXPECT_EQ(entries.back().second.dictionary()->entries().front().first, "z");
}

TEST(PlistBinaryWriter, RoundTripsNotANumberBitForBit) {
    const double nan = std::numeric_limits<double>::quiet_NaN();
    const auto back = parsePropertyList(*serializeBinary(PlistValue::real(nan)));
    ASSERT_TRUE(back && back->isReal());
    EXPECT_EQ(std::bit_cast<std::uint64_t>(*back->realValue()), std::bit_cast<std::uint64_t>(nan));
}

TEST(PlistBinaryWriter, RoundTripsLargeCountsWithWideReferencesAndOffsets) {
    auto array = PlistArray::create();
    for (int i = 0; i < 700; ++i) {
        array->append(PlistValue::integer(i * 1000));
    }
    array->append(PlistValue::data(PlistData(70000, 0x5A)));
    array->append(PlistValue(std::string(300, 'x')));
    const PlistValue value(array);
    const auto bytes = serializeBinary(value);
    ASSERT_TRUE(bytes);
    // 703 objects need two-byte references; offsets past 65535 need three bytes.
    EXPECT_EQ((*bytes)[bytes->size() - 32 + 6], 3);
    EXPECT_EQ((*bytes)[bytes->size() - 32 + 7], 2);
    std::string error;
    const auto back = parsePropertyList(*bytes, &error);
    ASSERT_TRUE(back) << error;
    EXPECT_EQ(*back, value);
}

TEST(PlistBinaryWriter, CrossesWithTheXmlEncoding) {
    // Whole-second dates and finite reals survive binary -> value -> XML -> value unchanged.
    const PlistValue value =
        dictionaryOf({{"n", PlistValue::integer(-7)},
                      {"when", PlistValue::date(PlistDate{1772600767})},
                      {"rows", arrayOf({dictionaryOf({{"Name", "RSRP"}, {"Value", "-97"}})})}});
    const auto fromBinary = parsePropertyList(*serializeBinary(value));
    ASSERT_TRUE(fromBinary);
    const auto xml = serializeXml(*fromBinary);
    ASSERT_TRUE(xml);
    const auto fromXml = parsePropertyList(*xml);
    ASSERT_TRUE(fromXml);
    EXPECT_EQ(*fromXml, value);
}

TEST(PlistBinaryWriter, FailsOnNoneInvalidTextAndExcessiveNesting) {
    EXPECT_FALSE(serializeBinary(PlistValue()));
    EXPECT_FALSE(serializeBinary(arrayOf({PlistValue::integer(1), PlistValue()})));
    EXPECT_FALSE(serializeBinary(dictionaryOf({{std::string_view("k\xFF"), "v"}})));
    EXPECT_FALSE(serializeBinary(arrayOf({std::string_view("\xED\xA0\x80")})));

    PlistValue nested = PlistValue::newArray();
    for (int level = 1; level < kMaxPlistDepth; ++level) {
        nested = arrayOf({nested});
    }
    const auto deepest = serializeBinary(nested);  // exactly kMaxPlistDepth levels
    ASSERT_TRUE(deepest);
    const auto back = parsePropertyList(*deepest);
    ASSERT_TRUE(back);
    EXPECT_EQ(*back, nested);
    EXPECT_FALSE(serializeBinary(arrayOf({nested})));
}

}  // namespace
}  // namespace velmar
