#include "logfile/records/RecordBuilder.h"

#include "core/platform/RecordWriter.h"
#include "core/platform/logcodes/ExtraLogCodes.h"
#include "core/platform/plist/PlistCodec.h"

namespace velmar {

RecordBuilder::RecordBuilder(std::uint16_t logCode, std::uint64_t timestamp, std::uint8_t logType)
    : packet_(kPacketHeaderLength, 0) {
    RecordWriter(packet_)
        .unsignedLE(0, 1, logType)
        .unsignedLE(kPacketCodeOffset, 2, logCode)
        .unsignedLE(kPacketTimestampOffset, 8, timestamp);
}

RecordBuilder& RecordBuilder::unsignedLE(std::size_t offset, std::size_t width, std::uint64_t value) {
    RecordWriter(packet_).unsignedLE(offset, width, value);
    return *this;
}

RecordBuilder& RecordBuilder::unsignedBE(std::size_t offset, std::size_t width, std::uint64_t value) {
    RecordWriter(packet_).unsignedBE(offset, width, value);
    return *this;
}

RecordBuilder& RecordBuilder::bits(std::size_t offset, std::size_t width, unsigned lowBit, unsigned highBit,
                                   std::uint32_t value) {
    RecordWriter(packet_).bits(offset, width, lowBit, highBit, value);
    return *this;
}

RecordBuilder& RecordBuilder::bytes(std::size_t offset, ByteView values) {
    RecordWriter(packet_).bytes(offset, values);
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
    RecordWriter(packet).unsignedLE(kPacketRecordLengthOffset, 2, packet.size() - 1);
    return packet;
}

PlistData buildExtendedPacket(std::uint16_t code, ByteView payload, std::uint64_t timestamp) {
    return RecordBuilder(code, timestamp, kExtendedLogType).bytes(kPacketHeaderLength, payload).build();
}

PlistData buildCellMonitorPacket(const PlistValue& cells, std::uint64_t timestamp) {
    const auto serialised = serializeBinary(cells);
    return buildExtendedPacket(extraPacketCode(kLogCodeCellMonitor),
                               serialised ? ByteView(*serialised) : ByteView(), timestamp);
}

}  // namespace velmar
