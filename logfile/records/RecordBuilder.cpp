#include "logfile/records/RecordBuilder.h"

#include "core/platform/plist/PlistCodec.h"

namespace velmar {

RecordBuilder::RecordBuilder(std::uint16_t logCode, std::uint64_t timestamp, std::uint8_t logType)
    : packet_(kPacketHeaderLength, 0) {
    packet_[0] = logType;
    unsignedLE(3, 2, logCode);
    unsignedLE(5, 8, timestamp);
}

void RecordBuilder::ensure(std::size_t end) {
    if (packet_.size() < end) {
        packet_.resize(end, 0);
    }
}

RecordBuilder& RecordBuilder::unsignedLE(std::size_t offset, std::size_t width, std::uint64_t value) {
    ensure(offset + width);
    for (std::size_t i = 0; i < width; ++i) {
        packet_[offset + i] = static_cast<std::uint8_t>(value >> (8 * i));
    }
    return *this;
}

RecordBuilder& RecordBuilder::unsignedBE(std::size_t offset, std::size_t width, std::uint64_t value) {
    ensure(offset + width);
    for (std::size_t i = 0; i < width; ++i) {
        packet_[offset + width - 1 - i] = static_cast<std::uint8_t>(value >> (8 * i));
    }
    return *this;
}

RecordBuilder& RecordBuilder::bits(std::size_t offset, std::size_t width, unsigned lowBit, unsigned highBit,
                                   std::uint32_t value) {
    ensure(offset + width);
    const unsigned count = highBit - lowBit + 1;
    const std::uint64_t mask = (count >= 64 ? ~std::uint64_t{0} : (std::uint64_t{1} << count) - 1) << lowBit;
    std::uint64_t word = 0;
    for (std::size_t i = width; i-- > 0;) {
        word = (word << 8) | packet_[offset + i];
    }
    word = (word & ~mask) | ((static_cast<std::uint64_t>(value) << lowBit) & mask);
    return unsignedLE(offset, width, word);
}

RecordBuilder& RecordBuilder::bytes(std::size_t offset, ByteView values) {
    ensure(offset + values.size());
    std::copy(values.begin(), values.end(), packet_.begin() + static_cast<std::ptrdiff_t>(offset));
    return *this;
}

RecordBuilder& RecordBuilder::resize(std::size_t totalLength) {
    packet_.resize(totalLength, 0);
    return *this;
}

PlistData RecordBuilder::build() const {
    PlistData packet = packet_;
    if (packet.size() < kPacketHeaderLength) {
        packet.resize(kPacketHeaderLength, 0);
    }
    const std::size_t recordLength = packet.size() - 1;
    packet[1] = static_cast<std::uint8_t>(recordLength & 0xFF);
    packet[2] = static_cast<std::uint8_t>((recordLength >> 8) & 0xFF);
    return packet;
}

PlistData buildExtendedPacket(std::uint16_t code, ByteView payload, std::uint64_t timestamp) {
    return RecordBuilder(code, timestamp, kExtendedLogType).bytes(kPacketHeaderLength, payload).build();
}

PlistData buildCellMonitorPacket(const PlistValue& cells, std::uint64_t timestamp) {
    const auto serialised = serializeBinary(cells);
    return buildExtendedPacket(0x0001, serialised ? ByteView(*serialised) : ByteView(), timestamp);
}

}  // namespace velmar
