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

#include "core/platform/BasebandPacket.h"
#include "core/platform/ByteView.h"
#include "core/platform/RecordReader.h"
#include "core/platform/plist/PlistValue.h"
#include "logfile/DlfFile.h"

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

enum class DiagFrameProblem : std::uint8_t {
    None,
    Empty,
    WrappersTooDeep,
    EmptyWrapper,    // size: the wrapper's bytes
    ShortLogPacket,  // size: the packet's bytes
    ShortRecord,     // size: the record length
    LongRecord,      // size: the record length; packetSize: the packet's bytes
};

// What one checked frame holds (its payload: CRC removed, escapes undone). Plain data: reading a frame
// allocates nothing, and a damaged one is described only when its text is asked for.
struct DiagFrameContents {
    enum class Kind : std::uint8_t { LogPacket, Other, Bad };

    Kind kind = Kind::Other;
    // The subscription id of the outermost wrapper; none for a frame that came unwrapped.
    std::optional<std::uint32_t> subscription;
    // The frame inside its wrappers (the whole payload when unwrapped); never empty unless Bad.
    std::span<std::uint8_t> packet;
    // LogPacket: the DLF record's length, read from the packet.
    std::size_t recordLength = 0;
    // Bad: what is wrong, and the sizes its description names.
    DiagFrameProblem problem = DiagFrameProblem::None;
    std::size_t size = 0;
    std::size_t packetSize = 0;

    // Bad: why, for a message.
    std::string problemText() const;
    // LogPacket: the blob (0x01 followed by the DLF record), inside packet. Derived rather than stored, so
    // that handing it on reads two registers' worth of fields apart, not a pair just written.
    ByteView blob() const { return ByteView(packet.data() + 3, 1 + recordLength); }
};

// Reads a checked payload of at least one byte. For a log packet the byte before the record (the high byte
// of the packet's first length) is overwritten with the blob's type byte 0x01, so the blob needs no copy.
// Inline, because it runs once per frame and its caller reads the result at once: one result object, kept
// in registers, makes no trip through memory. Every unwrapping step leaves at least one byte, so nothing
// past the payload is ever looked at. A damaged wrapper says nothing of a subscription or packet; a damaged
// log packet keeps what its wrappers said.
[[gnu::always_inline]] inline DiagFrameContents readDiagFrame(std::span<std::uint8_t> payload) {
    DiagFrameContents contents;
    const auto damaged = [&contents](DiagFrameProblem problem, std::size_t size = 0,
                                     std::size_t packetSize = 0) {
        contents.kind = DiagFrameContents::Kind::Bad;
        contents.problem = problem;
        contents.size = size;
        contents.packetSize = packetSize;
    };
    const auto damagedWrapper = [&contents, &damaged](DiagFrameProblem problem, std::size_t size = 0) {
        contents.subscription.reset();
        damaged(problem, size);
    };
    if (payload.empty()) {
        damaged(DiagFrameProblem::Empty);
        return contents;
    }
    std::size_t first = 0;
    const std::size_t length = payload.size();
    int depth = 0;
    while (payload[first] == kDiagWrapper) {
        if (length - first < 2 || payload[first + 1] != 0x01) {
            break;  // a wrapper version this reader does not know: an "other" frame
        }
        if (depth == kMaxDiagWrapperDepth) {
            damagedWrapper(DiagFrameProblem::WrappersTooDeep);
            return contents;
        }
        if (length - first <= kDiagWrapperHeaderSize) {
            damagedWrapper(DiagFrameProblem::EmptyWrapper, length - first);
            return contents;
        }
        if (depth == 0) {
            contents.subscription = RecordReader(payload.subspan(first)).u32(4);
        }
        first += kDiagWrapperHeaderSize;
        ++depth;
    }
    contents.packet = payload.subspan(first);
    const std::span<std::uint8_t> packet = contents.packet;
    if (packet[0] != kDiagLogPacket) {
        contents.kind = DiagFrameContents::Kind::Other;
        return contents;
    }
    if (packet.size() < 6) {
        damaged(DiagFrameProblem::ShortLogPacket, packet.size());
        return contents;
    }
    const std::size_t recordLength = RecordReader(packet).u16(4);
    if (recordLength < kDlfHeaderSize) {
        damaged(DiagFrameProblem::ShortRecord, recordLength);
        return contents;
    }
    if (4 + recordLength > packet.size()) {
        damaged(DiagFrameProblem::LongRecord, recordLength, packet.size());
        return contents;
    }
    packet[3] = kPlainLogType;
    contents.kind = DiagFrameContents::Kind::LogPacket;
    contents.recordLength = recordLength;
    return contents;
}

}  // namespace velmar
