#include "LogGenerator/C2K/C2KSubpackets.h"

#include "core/platform/SystemLog.h"

namespace velmar::c2k {

namespace {
constexpr std::size_t kSubpacketSizeOffset = 2;
}

std::optional<std::size_t> findSubpacket(const RecordReader& packet, std::uint8_t identifier) {
    const std::uint32_t count = packet.u8(kSubpacketCountOffset);
    std::size_t offset = kFirstSubpacketOffset;
    for (std::uint32_t index = 0; index < count; ++index) {
        const std::uint32_t size = packet.u16(offset + kSubpacketSizeOffset);
        // A subpacket may not reach the last byte of the packet; its end must lie strictly before it.
        if (offset + size >= packet.size()) {
            SystemLog::log(kLogError, "Log code error in subpkt#%d: bad size (%d).", static_cast<int>(index),
                           static_cast<int>(size));
            return std::nullopt;
        }
        if (packet.u8(offset) == identifier) {
            return offset;
        }
        offset += size;
    }
    return std::nullopt;
}

}  // namespace velmar::c2k
