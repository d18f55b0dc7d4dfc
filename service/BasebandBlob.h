// BasebandBlob: one blob as a baseband source produces it, with the framing facts that channel filters need.
//
// A blob is handed on exactly as the source read it. Its framing (core/platform/BasebandPacket.h) is read
// only as far as filtering needs: the packet's log type (plain or extended) and its 16-bit log code. A blob
// whose packet is too short to hold the code, or whose type is neither, is Unframed: only channels that take
// every blob receive it.
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

// Reads the framing of bytes (which stay owned by the caller).
BasebandBlob frameBasebandBlob(ByteView bytes);

}  // namespace velmar
