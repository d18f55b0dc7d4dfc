// RecordWriter: the one way record bytes are written, the counterpart of RecordReader.
//
// Contract: writes unsigned integers of 1 to 8 bytes in either byte order, bit fields that span bytes, and
// runs of bytes, at any offset of a byte vector that the caller owns; the vector grows, zero-filled, to hold
// what is written, so a write never lands outside it. The append* operations write at its end. Signed values
// are written as their two's complement of the given width.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "core/platform/ByteView.h"

namespace velmar {

class RecordWriter {
  public:
    explicit RecordWriter(std::vector<std::uint8_t>& bytes) : bytes_(bytes) {}

    RecordWriter& unsignedLE(std::size_t offset, std::size_t width, std::uint64_t value) {
        ensure(offset, width);
        for (std::size_t i = 0; i < width; ++i) {
            bytes_[offset + i] = static_cast<std::uint8_t>(i < 8 ? value >> (8 * i) : 0);
        }
        return *this;
    }
    RecordWriter& unsignedBE(std::size_t offset, std::size_t width, std::uint64_t value) {
        ensure(offset, width);
        for (std::size_t i = 0; i < width; ++i) {
            bytes_[offset + width - 1 - i] = static_cast<std::uint8_t>(i < 8 ? value >> (8 * i) : 0);
        }
        return *this;
    }
    // Sets bits lowBit..highBit (inclusive, 0 = least significant) of the little-endian integer formed by the
    // width bytes (1..8) at offset to value, keeping the other bits.
    RecordWriter& bits(std::size_t offset, std::size_t width, unsigned lowBit, unsigned highBit,
                       std::uint64_t value) {
        ensure(offset, width);
        const unsigned count = highBit - lowBit + 1;
        const std::uint64_t mask = (count >= 64 ? ~std::uint64_t{0} : (std::uint64_t{1} << count) - 1)
                                   << lowBit;
        std::uint64_t word = 0;
        for (std::size_t i = width; i-- > 0;) {
            word = (word << 8) | bytes_[offset + i];
        }
        word = (word & ~mask) | ((value << lowBit) & mask);
        return unsignedLE(offset, width, word);
    }
    RecordWriter& bytes(std::size_t offset, ByteView values) {
        ensure(offset, values.size());
        std::copy(values.begin(), values.end(), bytes_.begin() + static_cast<std::ptrdiff_t>(offset));
        return *this;
    }

    RecordWriter& appendLE(std::size_t width, std::uint64_t value) {
        return unsignedLE(bytes_.size(), width, value);
    }
    RecordWriter& append(ByteView values) { return bytes(bytes_.size(), values); }

  private:
    void ensure(std::size_t offset, std::size_t width) {
        if (bytes_.size() < offset + width) {
            bytes_.resize(offset + width, 0);
        }
    }

    std::vector<std::uint8_t>& bytes_;
};

}  // namespace velmar
