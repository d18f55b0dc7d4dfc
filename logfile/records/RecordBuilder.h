// RecordBuilder: writes baseband log packets field by field, for the tests and the simulated baseband.
//
// Contract: a packet is framed as core/platform/BasebandPacket.h reads it: [log type][length u16][code u16]
// [timestamp 8][payload]; offsets given to the setters are packet offsets, so the first payload byte is
// offset 13, as decoders count. Setters grow the packet as
// needed (zero-filled) and write little-endian unless named big-endian; bits() ORs a value into bits
// low..high of the little-endian word of `width` bytes at offset. build() fills the header: the length field
// holds the DLF record's length (the packet's size minus the type byte). The builders are independent of the
// decoders: they write what a baseband writes.
#pragma once

#include <cstddef>
#include <cstdint>

#include "core/platform/BasebandPacket.h"
#include "core/platform/ByteView.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

class RecordBuilder {
  public:
    explicit RecordBuilder(std::uint16_t logCode, std::uint64_t timestamp = 0,
                           std::uint8_t logType = kPlainLogType);

    RecordBuilder& u8(std::size_t offset, std::uint32_t value) { return unsignedLE(offset, 1, value); }
    RecordBuilder& u16(std::size_t offset, std::uint32_t value) { return unsignedLE(offset, 2, value); }
    RecordBuilder& u24(std::size_t offset, std::uint32_t value) { return unsignedLE(offset, 3, value); }
    RecordBuilder& u32(std::size_t offset, std::uint32_t value) { return unsignedLE(offset, 4, value); }
    RecordBuilder& s8(std::size_t offset, std::int32_t value) {
        return unsignedLE(offset, 1, static_cast<std::uint32_t>(value));
    }
    RecordBuilder& s16(std::size_t offset, std::int32_t value) {
        return unsignedLE(offset, 2, static_cast<std::uint32_t>(value));
    }
    RecordBuilder& s32(std::size_t offset, std::int32_t value) {
        return unsignedLE(offset, 4, static_cast<std::uint32_t>(value));
    }
    RecordBuilder& u16be(std::size_t offset, std::uint32_t value) { return unsignedBE(offset, 2, value); }
    RecordBuilder& u32be(std::size_t offset, std::uint32_t value) { return unsignedBE(offset, 4, value); }
    RecordBuilder& unsignedLE(std::size_t offset, std::size_t width, std::uint64_t value);
    RecordBuilder& unsignedBE(std::size_t offset, std::size_t width, std::uint64_t value);
    RecordBuilder& bits(std::size_t offset, std::size_t width, unsigned lowBit, unsigned highBit,
                        std::uint32_t value);
    RecordBuilder& bytes(std::size_t offset, ByteView values);
    // Makes the packet exactly totalLength bytes long (header included), cutting or zero-filling.
    RecordBuilder& resize(std::size_t totalLength);

    std::size_t size() const { return packet_.size(); }
    PlistData build() const;

  private:
    PlistData packet_;
};

// An extended packet (log type 0xFF) for the 16-bit part of an extra code, holding payload after the header.
PlistData buildExtendedPacket(std::uint16_t code, ByteView payload, std::uint64_t timestamp = 0);
// The extra record 0xFF0001: the cell-monitor array serialised as a property list after the header.
PlistData buildCellMonitorPacket(const PlistValue& cells, std::uint64_t timestamp = 0);

}  // namespace velmar
