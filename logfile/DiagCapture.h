// DiagCapture: raw diagnostic-port captures, the byte stream exactly as it came off the port.
//
// Framing: each frame ends with 0x7E; inside a frame 0x7D escapes the next byte (XOR 0x20); the last two
// bytes of a frame are its CRC-16/X.25, little-endian. A frame that is damaged (bad CRC, an escape with
// nothing after it, fewer than 3 bytes, bytes after the last 0x7E) is counted as bad and skipped: captures
// from real phones hold a few of those and the rest of the stream is still good. Empty frames (0x7E 0x7E)
// are ignored.
//
// Frame kinds, by first byte:
// - 0x98 wraps another frame: [0x98][0x01][0x00 0x00][subscription id u32][inner frame without CRC]. The
//   inner frame is unwrapped (also when wrapped again, up to kMaxDiagWrapperDepth levels) and handled as a
//   frame. A 0x98 frame of another wrapper version counts as "other".
// - 0x10 is a log packet: [0x10][more u8][len u16][len2 u16][code u16][timestamp u64][payload], whose bytes
//   from offset 4 on are one DLF record of len2 bytes. It yields the blob 0x01 + that record. A len2 below
//   the DLF header or past the frame's end makes the frame bad.
// - anything else (command replies) is counted as "other" and skipped.
// Each blob's offset is where its frame starts in the input. The only fatal error is an unreadable file.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>

#include "logfile/LogItem.h"
#include "logfile/LogReadResult.h"

namespace velmar {

inline constexpr std::uint8_t kDiagFrameEnd = 0x7E;
inline constexpr std::uint8_t kDiagEscape = 0x7D;
inline constexpr std::uint8_t kDiagEscapeXor = 0x20;
inline constexpr std::uint8_t kDiagLogPacket = 0x10;
inline constexpr std::uint8_t kDiagWrapper = 0x98;
inline constexpr std::size_t kDiagWrapperHeaderSize = 8;
inline constexpr int kMaxDiagWrapperDepth = 4;

// CRC-16/X.25: reflected polynomial 0x8408, initial value 0xFFFF, final XOR 0xFFFF.
std::uint16_t crc16X25(std::span<const std::uint8_t> bytes);

// Streams the log packets of a capture held in memory; name is used in messages. Fills the frame counters
// of stats. Always answers true (damage is counted, not fatal).
bool scanDiagCaptureBytes(std::span<const std::uint8_t> bytes, const std::string& name,
                          const LogItemCallback& callback, std::string& error, LogReadStats* stats = nullptr);
LogReadResult parseDiagCaptureBytes(std::span<const std::uint8_t> bytes, const std::string& name);

bool forEachDiagCaptureItem(const std::string& path, const LogItemCallback& callback, std::string& error,
                            LogReadStats* stats = nullptr);
LogReadResult readDiagCapture(const std::string& path);

// Appends frame (its content, without CRC) to out as the port sends it: CRC appended, 0x7E and 0x7D escaped,
// 0x7E at the end.
void appendDiagFrame(PlistData& out, std::span<const std::uint8_t> frame);

}  // namespace velmar
