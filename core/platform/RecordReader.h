// RecordReader: the one way decoders read baseband record fields.
//
// Contract: reads unsigned and signed integers of 1 to 4 bytes in either byte order, and bit fields that span
// bytes, at any offset. Bytes that lie past the end of the record read as zero, so a list keeps the length
// its count gives while nothing outside the buffer is ever touched. Offsets are computed in size_t; an offset
// beyond the record (however large) simply reads zeros.
#pragma once

#include <cstddef>
#include <cstdint>

#include "core/platform/ByteView.h"

namespace velmar {

class RecordReader {
  public:
    explicit RecordReader(ByteView bytes) : bytes_(bytes) {}

    std::size_t size() const { return bytes_.size(); }
    ByteView bytes() const { return bytes_; }

    std::uint8_t byteAt(std::size_t offset) const { return offset < bytes_.size() ? bytes_[offset] : 0; }

    // Little-endian unsigned integer of width bytes (1..8).
    std::uint64_t unsignedLE(std::size_t offset, std::size_t width) const {
        std::uint64_t value = 0;
        for (std::size_t i = width; i-- > 0;) {
            value = (value << 8) | byteAt(offset + i);
        }
        return value;
    }
    std::uint64_t unsignedBE(std::size_t offset, std::size_t width) const {
        std::uint64_t value = 0;
        for (std::size_t i = 0; i < width; ++i) {
            value = (value << 8) | byteAt(offset + i);
        }
        return value;
    }
    // Two's-complement value of width bytes.
    static std::int64_t signExtend(std::uint64_t value, std::size_t width) {
        const unsigned bits = static_cast<unsigned>(width * 8);
        if (bits >= 64) {
            return static_cast<std::int64_t>(value);
        }
        const std::uint64_t sign = std::uint64_t{1} << (bits - 1);
        return static_cast<std::int64_t>((value ^ sign) - sign);
    }
    std::int64_t signedLE(std::size_t offset, std::size_t width) const {
        return signExtend(unsignedLE(offset, width), width);
    }
    std::int64_t signedBE(std::size_t offset, std::size_t width) const {
        return signExtend(unsignedBE(offset, width), width);
    }

    std::uint32_t u8(std::size_t offset) const { return byteAt(offset); }
    std::int32_t s8(std::size_t offset) const { return static_cast<std::int8_t>(byteAt(offset)); }
    std::uint32_t u16(std::size_t offset) const { return static_cast<std::uint32_t>(unsignedLE(offset, 2)); }
    std::int32_t s16(std::size_t offset) const { return static_cast<std::int16_t>(unsignedLE(offset, 2)); }
    std::uint32_t u24(std::size_t offset) const { return static_cast<std::uint32_t>(unsignedLE(offset, 3)); }
    std::uint32_t u32(std::size_t offset) const { return static_cast<std::uint32_t>(unsignedLE(offset, 4)); }
    std::int32_t s32(std::size_t offset) const { return static_cast<std::int32_t>(unsignedLE(offset, 4)); }

    // Bits lowBit..highBit (inclusive, 0 = least significant) of the little-endian integer formed by the
    // width bytes at offset.
    std::uint32_t bits(std::size_t offset, std::size_t width, unsigned lowBit, unsigned highBit) const {
        const std::uint64_t word = unsignedLE(offset, width);
        const unsigned count = highBit - lowBit + 1;
        const std::uint64_t mask = count >= 64 ? ~std::uint64_t{0} : (std::uint64_t{1} << count) - 1;
        return static_cast<std::uint32_t>((word >> lowBit) & mask);
    }

  private:
    ByteView bytes_;
};

}  // namespace velmar
