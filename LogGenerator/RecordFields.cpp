#include "LogGenerator/RecordFields.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <string_view>

namespace velmar {

namespace {

#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
template <typename Argument>
std::string formatOne(const char* format, Argument argument) {
    char text[128];
    const int length = std::snprintf(text, sizeof text, format, argument);
    if (length < 0) {
        return std::string();
    }
    return std::string(text, static_cast<std::size_t>(length) < sizeof text ? static_cast<std::size_t>(length)
                                                                            : sizeof text - 1);
}
#pragma GCC diagnostic pop

// The common formats "%d", "%u", "%ld" and "%f", alone or followed by a plain suffix ("%d dBm", "%f dB"), are
// written with to_chars instead of snprintf: decoders format several fields of every record, and snprintf
// dominates that cost. The text is the same as snprintf's ("%f" is fixed notation with six decimals). Any
// other format goes through snprintf.
template <typename Number, typename... Precision>
std::string formatNumber(const char* format, std::string_view conversion, Number value,
                         Precision... precision) {
    const std::string_view whole(format);
    const std::string_view suffix = whole.substr(std::min(conversion.size(), whole.size()));
    if (whole.substr(0, conversion.size()) != conversion || suffix.find('%') != std::string_view::npos) {
        return formatOne(format, value);
    }
    char digits[128];
    const auto result = std::to_chars(digits, digits + sizeof digits, value, precision...);
    if (result.ec != std::errc()) {
        return formatOne(format, value);
    }
    std::string text;
    text.reserve(static_cast<std::size_t>(result.ptr - digits) + suffix.size());
    text.append(digits, result.ptr);
    text.append(suffix);
    return text;
}

// A fixed-notation conversion with optional width and precision ("%f", "%.2f", "%4.2f"), alone or followed by
// a plain suffix ("%4.2f dBm"), is written with to_chars and padded with blanks to the width, as snprintf
// writes it (to_chars rounds as printf does, ties of exact binary values to even). Flags, longer widths or
// precisions, other conversions and non-finite values go through snprintf.
std::string formatFixed(const char* format, double value) {
    const std::string_view whole(format);
    std::size_t at = 1;
    auto number = [&](int& into) {
        const std::size_t start = at;
        int parsed = 0;
        while (at < whole.size() && at - start < 2 && whole[at] >= '0' && whole[at] <= '9') {
            parsed = parsed * 10 + (whole[at] - '0');
            ++at;
        }
        into = parsed;
        return at > start;
    };
    int width = 0;
    int precision = 6;
    if (whole.size() < 2 || whole[0] != '%' || whole[1] == '0' || !std::isfinite(value)) {
        return formatOne(format, value);
    }
    number(width);
    if (at < whole.size() && whole[at] == '.') {
        ++at;
        number(precision);
    }
    if (at >= whole.size() || whole[at] != 'f') {
        return formatOne(format, value);
    }
    const std::string_view suffix = whole.substr(at + 1);
    if (suffix.find('%') != std::string_view::npos) {
        return formatOne(format, value);
    }
    char digits[128];
    const auto result =
        std::to_chars(digits, digits + sizeof digits, value, std::chars_format::fixed, precision);
    if (result.ec != std::errc()) {
        return formatOne(format, value);
    }
    const auto length = static_cast<std::size_t>(result.ptr - digits);
    const auto wanted = static_cast<std::size_t>(width);
    const std::size_t padding = wanted > length ? wanted - length : 0;
    std::string text;
    text.reserve(padding + length + suffix.size());
    text.append(padding, ' ');
    text.append(digits, result.ptr);
    text.append(suffix);
    return text;
}

}  // namespace

std::string ValueNames::nameOf(std::int64_t raw) const {
    if (const char* name = find(raw)) {
        return name;
    }
    return formatOne(otherwiseFormat, static_cast<int>(raw));
}

std::string ValueFormat::render(std::int64_t raw) const {
    if (hasSentinel && raw == sentinel) {
        return sentinelText;
    }
    switch (kind) {
        case Kind::Int:
            return formatNumber(format, "%d", static_cast<int>(raw * multiplier + addend));
        case Kind::Unsigned:
            return formatNumber(format, "%u", static_cast<unsigned>(raw * multiplier + addend));
        case Kind::Long:
            return formatNumber(format, "%ld", static_cast<long>(raw * multiplier + addend));
        case Kind::Double:
            return formatFixed(format, static_cast<double>(raw) * scale + bias);
        case Kind::Names:
            return names->nameOf(raw);
    }
    return std::string();
}

std::int64_t RecordField::read(const RecordReader& record, std::size_t base) const {
    const std::size_t at = base + offset;
    switch (encoding) {
        case FieldEncoding::LittleUnsigned:
            return static_cast<std::int64_t>(record.unsignedLE(at, width));
        case FieldEncoding::LittleSigned:
            return record.signedLE(at, width);
        case FieldEncoding::BigUnsigned:
            return static_cast<std::int64_t>(record.unsignedBE(at, width));
        case FieldEncoding::BigSigned:
            return record.signedBE(at, width);
        case FieldEncoding::Bits:
            return record.bits(at, width, lowBit, highBit);
    }
    return 0;
}

void writeFields(std::span<const RecordField> fields, const RecordReader& record, std::size_t base,
                 PlistDictionary& dictionary) {
    for (const RecordField& field : fields) {
        dictionary.set(field.key, field.format.render(field.read(record, base)));
    }
}

PlistDictionaryRef rowFromFields(std::span<const RecordField> fields, const RecordReader& record,
                                 std::size_t base) {
    auto row = PlistDictionary::create();
    row->reserve(fields.size());
    writeFields(fields, record, base, *row);
    return row;
}

}  // namespace velmar
