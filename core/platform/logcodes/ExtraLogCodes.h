// ExtraLogCodes: the codes of the records that the telephony service supplies beside the baseband's log
// stream, as property lists behind a packet header of log type 0xFF. Their code is 0xFF0000 plus the 16-bit
// code of the packet; the start command asks for them under "SetKxExtraCodes" with 0xFF0000 taken off.
//
// Every log-code generator decodes all three, so each technology's log-code header includes this one.
#pragma once

#include <cstdint>

namespace velmar {

inline constexpr std::int32_t kExtraCodeBase = 0xFF0000;

inline constexpr std::int32_t kLogCodeSimFiles =
    kExtraCodeBase + 0x0000;  // SIM elementary files (dictionary)
inline constexpr std::int32_t kLogCodeCellMonitor =
    kExtraCodeBase + 0x0001;  // cell-monitor array (array of cells)
inline constexpr std::int32_t kLogCodePdpContexts = kExtraCodeBase + 0x0002;  // active PDP contexts (array)

// The 16-bit code that the packet of an extra record carries.
constexpr std::uint16_t extraPacketCode(std::int32_t extraCode) {
    return static_cast<std::uint16_t>(extraCode - kExtraCodeBase);
}

}  // namespace velmar
