// RecordFields: record layouts declared as tables (offset, width, key, format) and the one walker that reads
// them into a section dictionary, as network dissectors do.
//
// Contract: a RecordField names where a field lies (byte offset relative to a base, width in bytes, byte
// order and signedness, or a bit range of the little-endian word formed by those bytes), the key it is shown
// under, and a ValueFormat that turns the raw integer into the shown text: a printf format of the integer (as
// int, unsigned or long), a linear conversion (raw × scale + bias) in integer or double arithmetic, or a
// ValueNames table. A format may carry a sentinel raw value shown as a fixed text ("Not Present"). Fields are
// written in table order; reading goes through RecordReader, so fields past the end read as zero.
#pragma once

#include <cstdint>
#include <span>
#include <string>

#include "core/platform/RecordReader.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

// One row of a value-name table: raw values low..high (inclusive) are shown as name.
struct ValueName {
    std::int64_t low;
    std::int64_t high;
    const char* name;
};

// A value-name table; a raw value matched by no row is shown through otherwiseFormat, a printf format that
// may use the raw value as its one int argument ("Unknown", "[%d]", "[Reserved %d]").
struct ValueNames {
    std::span<const ValueName> rows;
    const char* otherwiseFormat;

    // The name of raw, or null when no row matches.
    const char* find(std::int64_t raw) const {
        for (const ValueName& row : rows) {
            if (raw >= row.low && raw <= row.high) {
                return row.name;
            }
        }
        return nullptr;
    }
    std::string nameOf(std::int64_t raw) const;
};

enum class FieldEncoding : std::uint8_t { LittleUnsigned, LittleSigned, BigUnsigned, BigSigned, Bits };

struct ValueFormat {
    enum class Kind : std::uint8_t { Int, Unsigned, Long, Double, Names };

    Kind kind = Kind::Int;
    const char* format = "%d";
    // Int, Unsigned and Long: shown value = raw × multiplier + addend (integer arithmetic).
    std::int64_t multiplier = 1;
    std::int64_t addend = 0;
    // Double: shown value = raw × scale + bias (double arithmetic).
    double scale = 1.0;
    double bias = 0.0;
    const ValueNames* names = nullptr;
    bool hasSentinel = false;
    std::int64_t sentinel = 0;
    const char* sentinelText = nullptr;

    // The same format, but the raw value `raw` is shown as `text`.
    constexpr ValueFormat withSentinel(std::int64_t raw, const char* text) const {
        ValueFormat copy = *this;
        copy.hasSentinel = true;
        copy.sentinel = raw;
        copy.sentinelText = text;
        return copy;
    }

    std::string render(std::int64_t raw) const;
};

// "%d" (or another int format) of raw × multiplier + addend; the result is taken as a 32-bit int, so 32-bit
// unsigned fields of 2^31 and above show negative, as "%d" does.
constexpr ValueFormat asInt(const char* format = "%d", std::int64_t multiplier = 1, std::int64_t addend = 0) {
    ValueFormat f;
    f.kind = ValueFormat::Kind::Int;
    f.format = format;
    f.multiplier = multiplier;
    f.addend = addend;
    return f;
}
constexpr ValueFormat asUnsigned(const char* format = "%u") {
    ValueFormat f;
    f.kind = ValueFormat::Kind::Unsigned;
    f.format = format;
    return f;
}
constexpr ValueFormat asLong(const char* format = "%ld") {
    ValueFormat f;
    f.kind = ValueFormat::Kind::Long;
    f.format = format;
    return f;
}
constexpr ValueFormat asDouble(const char* format, double scale = 1.0, double bias = 0.0) {
    ValueFormat f;
    f.kind = ValueFormat::Kind::Double;
    f.format = format;
    f.scale = scale;
    f.bias = bias;
    return f;
}
constexpr ValueFormat asName(const ValueNames& names) {
    ValueFormat f;
    f.kind = ValueFormat::Kind::Names;
    f.names = &names;
    return f;
}

struct RecordField {
    std::uint32_t offset;
    std::uint8_t width;  // bytes
    FieldEncoding encoding;
    std::uint8_t lowBit;  // Bits only
    std::uint8_t highBit;
    const char* key;
    ValueFormat format;

    std::int64_t read(const RecordReader& record, std::size_t base = 0) const;
};

constexpr RecordField u8Field(std::uint32_t offset, const char* key, ValueFormat format = asInt()) {
    return {offset, 1, FieldEncoding::LittleUnsigned, 0, 0, key, format};
}
constexpr RecordField s8Field(std::uint32_t offset, const char* key, ValueFormat format = asInt()) {
    return {offset, 1, FieldEncoding::LittleSigned, 0, 0, key, format};
}
constexpr RecordField u16Field(std::uint32_t offset, const char* key, ValueFormat format = asInt()) {
    return {offset, 2, FieldEncoding::LittleUnsigned, 0, 0, key, format};
}
constexpr RecordField s16Field(std::uint32_t offset, const char* key, ValueFormat format = asInt()) {
    return {offset, 2, FieldEncoding::LittleSigned, 0, 0, key, format};
}
constexpr RecordField u32Field(std::uint32_t offset, const char* key, ValueFormat format = asInt()) {
    return {offset, 4, FieldEncoding::LittleUnsigned, 0, 0, key, format};
}
constexpr RecordField s32Field(std::uint32_t offset, const char* key, ValueFormat format = asInt()) {
    return {offset, 4, FieldEncoding::LittleSigned, 0, 0, key, format};
}
constexpr RecordField intField(std::uint32_t offset, std::uint8_t width, FieldEncoding encoding,
                               const char* key, ValueFormat format = asInt()) {
    return {offset, width, encoding, 0, 0, key, format};
}
// Bits lowBit..highBit of the little-endian word of `width` bytes at offset.
constexpr RecordField bitField(std::uint32_t offset, std::uint8_t width, std::uint8_t lowBit,
                               std::uint8_t highBit, const char* key, ValueFormat format = asInt()) {
    return {offset, width, FieldEncoding::Bits, lowBit, highBit, key, format};
}

// Writes every field of the table, in order, into dictionary (fields relative to base).
void writeFields(std::span<const RecordField> fields, const RecordReader& record, std::size_t base,
                 PlistDictionary& dictionary);
// A new row dictionary holding the fields of the table.
PlistDictionaryRef rowFromFields(std::span<const RecordField> fields, const RecordReader& record,
                                 std::size_t base);

}  // namespace velmar
