// The binary ("bplist00") side of parsePropertyList.
//
// Layout read here: the 8-byte magic, the objects, a table of object offsets and a 32-byte trailer (6 unused
// bytes, the width of an offset-table entry, the width of an object reference, then the object count, the
// top object's number and the offset table's position as big-endian 64-bit numbers). Each object starts
// with a marker byte: the high nibble is its type, the low nibble a size or a count (15 meaning that an
// integer object follows with the real count).
//
// Safety: every position and length is checked against the buffer with arithmetic that cannot overflow; a
// count must fit in the bytes that remain, so a small file cannot ask for a large allocation. Objects are
// decoded on demand from the top object; a container that is met again while it is still being decoded is a
// reference cycle and fails, and containers may nest at most kMaxPlistDepth deep. Because objects may be
// shared (a writer may store a repeated value once), the decoded tree may be larger than the file: it is
// held to kExpansionFactor times the file size (plus a small allowance), in values and in text and data
// bytes alike, so a file of shared containers cannot expand exponentially. Errors name the byte offset of
// the offending object or field.
#include <bit>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "core/platform/plist/PlistCodec.h"
#include "core/platform/plist/Utf8.h"

namespace velmar::plist_detail {

std::optional<PlistValue> parseBinaryPropertyList(std::span<const std::uint8_t> bytes, std::string* error);

namespace {

constexpr std::size_t kMagicSize = 8;
constexpr std::size_t kTrailerSize = 32;
// Seconds from 1970-01-01 to 2001-01-01, the origin of binary dates.
constexpr double kDateOriginSince1970 = 978307200.0;
constexpr std::uint64_t kExpansionFactor = 16;
constexpr std::uint64_t kValueAllowance = 1 << 16;
constexpr std::uint64_t kByteAllowance = 1 << 20;

class BinaryReader {
  public:
    explicit BinaryReader(std::span<const std::uint8_t> bytes) : bytes_(bytes) {}

    std::optional<PlistValue> parse(std::string* error) {
        std::optional<PlistValue> result;
        if (readTrailer()) {
            PlistValue top;
            onPath_.assign(objectCount_, 0);
            valuesLeft_ = kExpansionFactor * bytes_.size() + kValueAllowance;
            bytesLeft_ = kExpansionFactor * bytes_.size() + kByteAllowance;
            if (decode(topObject_, 0, top)) {
                result = std::move(top);
            }
        }
        if (!result && error != nullptr) {
            *error = "offset " + std::to_string(errorOffset_) + ": " + message_;
        }
        return result;
    }

  private:
    bool fail(std::size_t offset, std::string message) {
        errorOffset_ = offset;
        message_ = std::move(message);
        return false;
    }

    // Reads an unsigned big-endian number of width bytes (1..8) at position; false when it does not fit
    // before limit.
    bool readUnsigned(std::size_t position, std::size_t width, std::size_t limit,
                      std::uint64_t& value) const {
        if (position > limit || width > limit - position) {
            return false;
        }
        value = 0;
        for (std::size_t i = 0; i < width; ++i) {
            value = (value << 8) | bytes_[position + i];
        }
        return true;
    }

    bool readTrailer() {
        if (bytes_.size() < kMagicSize + kTrailerSize + 1) {
            return fail(bytes_.size(), "binary property list too short for its trailer");
        }
        const std::size_t trailer = bytes_.size() - kTrailerSize;
        offsetWidth_ = bytes_[trailer + 6];
        refWidth_ = bytes_[trailer + 7];
        std::uint64_t count = 0;
        std::uint64_t top = 0;
        std::uint64_t table = 0;
        readUnsigned(trailer + 8, 8, bytes_.size(), count);
        readUnsigned(trailer + 16, 8, bytes_.size(), top);
        readUnsigned(trailer + 24, 8, bytes_.size(), table);
        if (offsetWidth_ < 1 || offsetWidth_ > 8) {
            return fail(trailer + 6, "invalid offset size " + std::to_string(offsetWidth_));
        }
        if (refWidth_ < 1 || refWidth_ > 8) {
            return fail(trailer + 7, "invalid object reference size " + std::to_string(refWidth_));
        }
        if (count == 0) {
            return fail(trailer + 8, "no objects");
        }
        if (top >= count) {
            return fail(trailer + 16, "top object " + std::to_string(top) + " out of range");
        }
        if (table < kMagicSize || table >= trailer) {
            return fail(trailer + 24, "offset table position " + std::to_string(table) + " out of range");
        }
        if (count > (trailer - table) / offsetWidth_) {
            return fail(trailer + 8,
                        "object count " + std::to_string(count) + " does not fit the offset table");
        }
        objectCount_ = static_cast<std::size_t>(count);
        topObject_ = static_cast<std::size_t>(top);
        offsetTable_ = static_cast<std::size_t>(table);
        objectsEnd_ = offsetTable_;
        tableEnd_ = trailer;
        return true;
    }

    // The position of object number ref, checked to lie in the object area.
    bool objectPosition(std::size_t ref, std::size_t& position) {
        std::uint64_t offset = 0;
        const std::size_t entry = offsetTable_ + ref * offsetWidth_;
        readUnsigned(entry, offsetWidth_, tableEnd_, offset);  // ref < objectCount_: within the table
        if (offset < kMagicSize || offset >= offsetTable_) {
            return fail(entry, "object " + std::to_string(ref) + " has offset " + std::to_string(offset) +
                                   " outside the object area");
        }
        position = static_cast<std::size_t>(offset);
        return true;
    }

    // Reads the count in a marker's low nibble, or the integer object that follows when the nibble is 15.
    // position is moved past the marker and any count object.
    bool readCount(std::size_t& position, std::uint64_t& count) {
        const std::size_t marker = position;
        count = bytes_[position] & 0x0FU;
        ++position;
        if (count != 0x0F) {
            return true;
        }
        if (position >= objectsEnd_) {
            return fail(marker, "truncated object count");
        }
        const std::uint8_t countMarker = bytes_[position];
        if ((countMarker & 0xF0U) != 0x10U || (countMarker & 0x0FU) > 3) {
            return fail(position, "object count is not an integer");
        }
        const std::size_t width = std::size_t{1} << (countMarker & 0x0FU);
        if (!readUnsigned(position + 1, width, objectsEnd_, count)) {
            return fail(position, "truncated object count");
        }
        if (width == 8 && count > static_cast<std::uint64_t>(std::numeric_limits<std::int64_t>::max())) {
            return fail(position, "negative object count");
        }
        position += 1 + width;
        return true;
    }

    // True when count items of itemSize bytes fit between position and the end of the object area.
    bool fits(std::size_t position, std::uint64_t count, std::size_t itemSize) const {
        return position <= objectsEnd_ && count <= (objectsEnd_ - position) / itemSize;
    }

    bool spend(std::size_t position, std::uint64_t values, std::uint64_t bytes) {
        if (values > valuesLeft_ || bytes > bytesLeft_) {
            return fail(position, "decoded document would be far larger than the file");
        }
        valuesLeft_ -= values;
        bytesLeft_ -= bytes;
        return true;
    }

    bool decode(std::size_t ref, std::size_t depth, PlistValue& out) {
        std::size_t position = 0;
        if (!objectPosition(ref, position) || !spend(position, 1, 0)) {
            return false;
        }
        const std::size_t start = position;
        const std::uint8_t marker = bytes_[position];
        switch (marker >> 4) {
            case 0x0:
                if (marker == 0x08 || marker == 0x09) {
                    out = PlistValue::boolean(marker == 0x09);
                    return true;
                }
                return fail(
                    start, marker == 0 ? std::string("null object") : "unknown object marker " + hex(marker));
            case 0x1:
                return decodeInteger(start, out);
            case 0x2:
                return decodeReal(start, out);
            case 0x3:
                return decodeDate(start, out);
            case 0x4:
                return decodeData(start, out);
            case 0x5:
            case 0x6:
                return decodeString(start, out);
            case 0xA:
            case 0xD:
                return decodeContainer(ref, start, depth, out);
            default:
                return fail(start, "unsupported object marker " + hex(marker));
        }
    }

    bool decodeInteger(std::size_t start, PlistValue& out) {
        const unsigned power = bytes_[start] & 0x0FU;
        if (power > 4) {
            return fail(start, "invalid integer size");
        }
        const std::size_t width = std::size_t{1} << power;
        if (width == 16) {
            // A 128-bit two's-complement number: accepted only when it is an int64 written long.
            std::uint64_t high = 0;
            std::uint64_t low = 0;
            if (!readUnsigned(start + 1, 8, objectsEnd_, high) ||
                !readUnsigned(start + 9, 8, objectsEnd_, low)) {
                return fail(start, "truncated integer");
            }
            const bool negative = (low >> 63) != 0;
            if (high != (negative ? ~std::uint64_t{0} : 0)) {
                return fail(start, "integer does not fit in 64 bits");
            }
            out = PlistValue::integer(static_cast<std::int64_t>(low));
            return true;
        }
        std::uint64_t value = 0;
        if (!readUnsigned(start + 1, width, objectsEnd_, value)) {
            return fail(start, "truncated integer");
        }
        // Widths below 8 bytes are unsigned; 8 bytes are two's complement.
        out = PlistValue::integer(static_cast<std::int64_t>(value));
        return true;
    }

    bool readDouble(std::size_t start, std::size_t width, double& value) {
        std::uint64_t bits = 0;
        if (!readUnsigned(start + 1, width, objectsEnd_, bits)) {
            return false;
        }
        if (width == 4) {
            value = std::bit_cast<float>(static_cast<std::uint32_t>(bits));
        } else {
            value = std::bit_cast<double>(bits);
        }
        return true;
    }

    bool decodeReal(std::size_t start, PlistValue& out) {
        const std::uint8_t marker = bytes_[start];
        if (marker != 0x22 && marker != 0x23) {
            return fail(start, "unsupported real size " + hex(marker));
        }
        double value = 0;
        if (!readDouble(start, marker == 0x22 ? 4 : 8, value)) {
            return fail(start, "truncated real");
        }
        out = PlistValue::real(value);
        return true;
    }

    bool decodeDate(std::size_t start, PlistValue& out) {
        double sinceOrigin = 0;
        if (bytes_[start] != 0x33) {
            return fail(start, "unsupported date marker " + hex(bytes_[start]));
        }
        if (!readDouble(start, 8, sinceOrigin)) {
            return fail(start, "truncated date");
        }
        if (!std::isfinite(sinceOrigin)) {
            return fail(start, "date is not a finite number");
        }
        out = PlistValue::date(PlistDate{sinceOrigin + kDateOriginSince1970});
        return true;
    }

    bool decodeData(std::size_t start, PlistValue& out) {
        std::size_t position = start;
        std::uint64_t count = 0;
        if (!readCount(position, count)) {
            return false;
        }
        if (!fits(position, count, 1)) {
            return fail(start, "data length " + std::to_string(count) + " runs past the object area");
        }
        if (!spend(start, 0, count)) {
            return false;
        }
        const auto* first = bytes_.data() + position;
        out = PlistValue::data(PlistData(first, first + count));
        return true;
    }

    bool decodeString(std::size_t start, PlistValue& out) {
        const bool wide = (bytes_[start] >> 4) == 0x6;
        std::size_t position = start;
        std::uint64_t count = 0;
        if (!readCount(position, count)) {
            return false;
        }
        if (!fits(position, count, wide ? 2 : 1)) {
            return fail(start, "string length " + std::to_string(count) + " runs past the object area");
        }
        if (!spend(start, 0, wide ? count * 3 : count)) {
            return false;
        }
        std::string text;
        if (!wide) {
            text.assign(reinterpret_cast<const char*>(bytes_.data() + position), count);
            for (const char c : text) {
                if (static_cast<unsigned char>(c) >= 0x80) {
                    return fail(start, "ASCII string holds a byte above 0x7F");
                }
            }
        } else if (!decodeUtf16(position, count, text)) {
            return false;
        }
        out = PlistValue(std::move(text));
        return true;
    }

    bool decodeUtf16(std::size_t position, std::size_t units, std::string& text) {
        text.reserve(units);
        for (std::size_t i = 0; i < units; ++i) {
            const std::size_t at = position + 2 * i;
            char32_t unit = static_cast<char32_t>((bytes_[at] << 8) | bytes_[at + 1]);
            if (unit >= 0xD800 && unit <= 0xDBFF) {
                const std::size_t next = at + 2;
                if (i + 1 == units) {
                    return fail(at, "unpaired UTF-16 surrogate");
                }
                const auto low = static_cast<char32_t>((bytes_[next] << 8) | bytes_[next + 1]);
                if (low < 0xDC00 || low > 0xDFFF) {
                    return fail(at, "unpaired UTF-16 surrogate");
                }
                unit = 0x10000 + ((unit - 0xD800) << 10) + (low - 0xDC00);
                ++i;
            } else if (unit >= 0xDC00 && unit <= 0xDFFF) {
                return fail(at, "unpaired UTF-16 surrogate");
            }
            appendUtf8(text, unit);
        }
        return true;
    }

    bool decodeContainer(std::size_t ref, std::size_t start, std::size_t depth, PlistValue& out) {
        const bool isDictionary = (bytes_[start] >> 4) == 0xD;
        if (depth + 1 > static_cast<std::size_t>(kMaxPlistDepth)) {
            return fail(start, "containers nested deeper than " + std::to_string(kMaxPlistDepth) + " levels");
        }
        if (onPath_[ref] != 0) {
            return fail(start, "object " + std::to_string(ref) + " contains itself");
        }
        std::size_t position = start;
        std::uint64_t count = 0;
        if (!readCount(position, count)) {
            return false;
        }
        const std::uint64_t refs = isDictionary ? 2 * count : count;  // count fits the file: no overflow
        if (!fits(position, count, refWidth_) || !fits(position, refs, refWidth_)) {
            return fail(start, "container of " + std::to_string(count) + " items runs past the object area");
        }
        onPath_[ref] = 1;
        const bool decoded = isDictionary ? decodeDictionary(position, count, depth, out)
                                          : decodeArray(position, count, depth, out);
        onPath_[ref] = 0;
        return decoded;
    }

    bool readRef(std::size_t position, std::size_t index, std::size_t& ref) {
        std::uint64_t value = 0;
        const std::size_t at = position + index * refWidth_;
        readUnsigned(at, refWidth_, objectsEnd_, value);  // checked by decodeContainer
        if (value >= objectCount_) {
            return fail(at, "object reference " + std::to_string(value) + " out of range");
        }
        ref = static_cast<std::size_t>(value);
        return true;
    }

    bool decodeArray(std::size_t position, std::size_t count, std::size_t depth, PlistValue& out) {
        auto array = PlistArray::create();
        array->reserve(count);
        for (std::size_t i = 0; i < count; ++i) {
            std::size_t ref = 0;
            PlistValue item;
            if (!readRef(position, i, ref) || !decode(ref, depth + 1, item)) {
                return false;
            }
            array->append(std::move(item));
        }
        out = PlistValue(std::move(array));
        return true;
    }

    bool decodeDictionary(std::size_t position, std::size_t count, std::size_t depth, PlistValue& out) {
        auto dictionary = PlistDictionary::create();
        dictionary->reserve(count);
        for (std::size_t i = 0; i < count; ++i) {
            std::size_t keyRef = 0;
            std::size_t valueRef = 0;
            if (!readRef(position, i, keyRef) || !readRef(position, count + i, valueRef)) {
                return false;
            }
            std::size_t keyPosition = 0;
            if (!objectPosition(keyRef, keyPosition)) {
                return false;
            }
            const unsigned keyType = bytes_[keyPosition] >> 4;
            if (keyType != 0x5 && keyType != 0x6) {
                return fail(keyPosition, "dictionary key is not a string");
            }
            PlistValue key;
            PlistValue value;
            if (!decode(keyRef, depth + 1, key) || !decode(valueRef, depth + 1, value)) {
                return false;
            }
            dictionary->set(*key.string(), std::move(value));
        }
        out = PlistValue(std::move(dictionary));
        return true;
    }

    static std::string hex(std::uint8_t byte) {
        static constexpr char kDigits[] = "0123456789abcdef";
        return std::string{'0', 'x', kDigits[byte >> 4], kDigits[byte & 0x0F]};
    }

    std::span<const std::uint8_t> bytes_;
    std::size_t offsetWidth_ = 0;
    std::size_t refWidth_ = 0;
    std::size_t objectCount_ = 0;
    std::size_t topObject_ = 0;
    std::size_t offsetTable_ = 0;
    std::size_t objectsEnd_ = 0;  // objects lie in [kMagicSize, objectsEnd_), the offset table after them
    std::size_t tableEnd_ = 0;
    std::vector<std::uint8_t> onPath_;
    std::uint64_t valuesLeft_ = 0;
    std::uint64_t bytesLeft_ = 0;
    std::size_t errorOffset_ = 0;
    std::string message_;
};

}  // namespace

std::optional<PlistValue> parseBinaryPropertyList(std::span<const std::uint8_t> bytes, std::string* error) {
    BinaryReader reader(bytes);
    return reader.parse(error);
}

}  // namespace velmar::plist_detail
