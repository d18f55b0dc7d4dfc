// C2KSubpackets: the subpacket search of the 1x records 0x119C and 0x119D.
//
// Layout: byte 14 of the packet is the number of subpackets; they follow one another from offset 17. Each
// begins with its identifier byte and holds its total size (header included) as 16 bits at its bytes 2..3.
// Contract: findSubpacket walks at most as many subpackets as byte 14 says, in order, and answers the packet
// offset of the first whose identifier is the wanted one. A subpacket whose end would lie at or beyond the
// end of the packet stops the search with "Log code error in subpkt#%d: bad size (%d)." (error priority; the
// subpacket's index counting from 0, and its size), and nothing is found.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>

#include "core/platform/RecordReader.h"

namespace velmar::c2k {

inline constexpr std::size_t kSubpacketCountOffset = 14;
inline constexpr std::size_t kFirstSubpacketOffset = 17;

std::optional<std::size_t> findSubpacket(const RecordReader& packet, std::uint8_t identifier);

}  // namespace velmar::c2k
