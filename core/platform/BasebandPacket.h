// BasebandPacket: the framing of a baseband blob, read in one place.
//
// A blob is an optional 2-byte channel prefix (first byte 0x81, then the channel) followed by a log packet:
//
//   offset 0   log type u8         1: plain, 0xFF: extended (a record the telephony service adds)
//   offset 1   record length u16   the DLF record's length: the packet without its type byte
//   offset 3   log code u16
//   offset 5   timestamp u64       baseband ticks in the upper 48 bits
//   offset 13  payload
//
// all little-endian. Decoders know an extended packet's code as 0xFF0000 plus its 16-bit code.
//
// Contract: frameBasebandPacket never reads outside the blob. A blob of 2 bytes or more whose first byte is
// 0x81 has a prefix (a log type is never 0x81); header fields that lie past the end of the packet read as
// zero, and the has* flags tell which ones the packet really holds. The views point into the blob.
#pragma once

#include <cstddef>
#include <cstdint>

#include "core/platform/ByteView.h"
#include "core/platform/RecordReader.h"

namespace velmar {

inline constexpr std::uint8_t kChannelPrefixMarker = 0x81;
inline constexpr std::size_t kChannelPrefixLength = 2;

inline constexpr std::size_t kPacketHeaderLength = 13;
inline constexpr std::size_t kPacketRecordLengthOffset = 1;
inline constexpr std::size_t kPacketCodeOffset = 3;
inline constexpr std::size_t kPacketTimestampOffset = 5;

inline constexpr std::uint8_t kPlainLogType = 1;
inline constexpr std::uint8_t kExtendedLogType = 0xFF;
inline constexpr std::int32_t kExtendedCodeBase = 0xFF0000;

struct BasebandPacket {
    ByteView packet;               // the blob without its channel prefix
    std::size_t prefixLength = 0;  // 0, or kChannelPrefixLength
    std::uint8_t logType = 0;      // 0 when the packet is empty
    std::uint16_t recordLength = 0;
    std::uint16_t code = 0;  // the 16-bit code as the packet holds it
    std::uint64_t timestamp = 0;

    bool hasRecordLength() const { return packet.size() >= kPacketCodeOffset; }
    bool hasCode() const { return packet.size() >= kPacketTimestampOffset; }
    bool hasHeader() const { return packet.size() >= kPacketHeaderLength; }
    bool isPlain() const { return logType == kPlainLogType; }
    bool isExtended() const { return logType == kExtendedLogType; }

    // The code that decoders subscribe to: the 16-bit code, plus 0xFF0000 for an extended packet.
    std::int32_t logCode() const { return isExtended() ? kExtendedCodeBase + code : code; }
};

// The blob without its channel prefix, when it has one.
inline ByteView withoutChannelPrefix(ByteView blob) {
    if (blob.size() >= kChannelPrefixLength && blob[0] == kChannelPrefixMarker) {
        return blob.subspan(kChannelPrefixLength);
    }
    return blob;
}

// The header fields of packet, the blob without its channel prefix: the one reading of a header.
inline BasebandPacket readBasebandHeader(ByteView blob, ByteView packet) {
    BasebandPacket framed;
    framed.packet = packet;
    framed.prefixLength = blob.size() - packet.size();
    const RecordReader reader(packet);
    framed.logType = reader.byteAt(0);
    framed.recordLength = static_cast<std::uint16_t>(reader.u16(kPacketRecordLengthOffset));
    framed.code = static_cast<std::uint16_t>(reader.u16(kPacketCodeOffset));
    framed.timestamp = reader.unsignedLE(kPacketTimestampOffset, 8);
    return framed;
}

// Out of line: a packet shorter than a whole header is rare.
BasebandPacket frameShortBasebandPacket(ByteView blob);

// Inline for a packet with a whole header, because it runs once per packet and its result is read at once.
inline BasebandPacket frameBasebandPacket(ByteView blob) {
    const ByteView packet = withoutChannelPrefix(blob);
    return packet.size() < kPacketHeaderLength ? frameShortBasebandPacket(blob)
                                               : readBasebandHeader(blob, packet);
}

}  // namespace velmar
