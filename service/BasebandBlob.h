// BasebandBlob: one blob as a baseband source produces it, with the framing facts that channel filters need.
//
// A blob is handed on exactly as the source read it. Its framing is read only as far as filtering needs: an
// optional 2-byte channel prefix (first byte 0x81), then the packet's log type (1 ordinary, 0xFF extended)
// and its 16-bit little-endian log code at packet offsets 3 and 4. A blob whose packet is too short to hold
// the code, or whose type is neither, is Unframed: only channels that take every blob receive it.
#pragma once

#include <cstdint>

#include "core/platform/ByteView.h"

namespace velmar {

enum class BlobKind : std::uint8_t { Ordinary, Extended, Unframed };

struct BasebandBlob {
    ByteView bytes;  // owned by the source; valid only while it is being delivered
    BlobKind kind = BlobKind::Unframed;
    std::uint16_t code = 0;  // the packet's 16-bit code (not offset by 0xFF0000 for extended packets)
};

inline constexpr std::uint8_t kBlobPrefixMarker = 0x81;
inline constexpr std::size_t kBlobPrefixSize = 2;

// Reads the framing of bytes (which stay owned by the caller).
BasebandBlob frameBasebandBlob(ByteView bytes);

// The packet inside a blob: the bytes after the channel prefix when there is one.
ByteView basebandPacket(ByteView bytes);

}  // namespace velmar
