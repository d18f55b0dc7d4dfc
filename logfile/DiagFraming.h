// DiagFraming: the diagnostic port's framing in both directions, shared by the capture readers, the live
// session and the tests' modem.
//
// Wire frame: escape(payload || CRC-16/X.25 of the payload, low byte first) || 0x7E. Escaping turns 0x7E
// into 7D 5E and 0x7D into 7D 5D, over the payload and both CRC bytes; the closing 0x7E is not escaped.
// Receiving (DiagStreamDeframer) undoes this and checks the CRC; readDiagFrame() then says what a checked
// frame holds:
// - 0x98 wraps another frame: [0x98][0x01][0x00 0x00][subscription id u32][inner frame without CRC]. The
//   inner frame is unwrapped (also when wrapped again, up to kMaxDiagWrapperDepth levels). A 0x98 frame of
//   another wrapper version is "other".
// - 0x10 is a log packet: [0x10][pending u8][len u16][len2 u16][code u16][timestamp u64][payload], whose
//   bytes from offset 4 on are one DLF record of len2 bytes: the blob is 0x01 followed by that record.
// - anything else (responses, events, debug messages) is "other", for its reader to interpret.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <span>
#include <string>

#include "core/platform/ByteView.h"
#include "core/platform/plist/PlistValue.h"

namespace velmar {

inline constexpr std::uint8_t kDiagFrameEnd = 0x7E;
inline constexpr std::uint8_t kDiagEscape = 0x7D;
inline constexpr std::uint8_t kDiagEscapeXor = 0x20;
inline constexpr std::uint8_t kDiagLogPacket = 0x10;
inline constexpr std::uint8_t kDiagWrapper = 0x98;
inline constexpr std::size_t kDiagWrapperHeaderSize = 8;
inline constexpr int kMaxDiagWrapperDepth = 4;

// CRC-16/X.25: reflected polynomial 0x8408, initial value 0xFFFF, final XOR 0xFFFF; check("123456789") is
// 0x906E. Table-driven, eight bytes at a time (slice-by-8).
std::uint16_t crc16X25(std::span<const std::uint8_t> bytes);

// Appends payload as the port sends it: CRC appended, 0x7E and 0x7D escaped, 0x7E at the end.
void appendDiagFrame(PlistData& out, std::span<const std::uint8_t> payload);

// What one checked frame holds (its payload: CRC removed, escapes undone).
struct DiagFrameContents {
    enum class Kind : std::uint8_t { LogPacket, Other, Bad };

    Kind kind = Kind::Other;
    // The subscription id of the outermost wrapper; none for a frame that came unwrapped.
    std::optional<std::uint32_t> subscription;
    // The frame inside its wrappers (the whole payload when unwrapped); never empty unless Bad.
    std::span<std::uint8_t> packet;
    // LogPacket: the blob (0x01 followed by the DLF record), inside packet.
    ByteView blob;
    // Bad: why, for a message.
    std::string problem;
};

// Reads a checked payload of at least one byte. For a log packet the byte before the record (the high byte
// of the packet's first length) is overwritten with the blob's type byte 0x01, so the blob needs no copy.
DiagFrameContents readDiagFrame(std::span<std::uint8_t> payload);

}  // namespace velmar
