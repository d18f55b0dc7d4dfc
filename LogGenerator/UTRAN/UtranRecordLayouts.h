// UtranRecordLayouts: the geometry of the UTRAN channel-quality record 0xD00C, which feeds two decoders.
// Offsets count from the first byte of the packet (the 13-byte header included).
#pragma once

#include <cstddef>
#include <cstdint>

#include "core/platform/RecordReader.h"

namespace velmar::utran_layout::channel_quality {

inline constexpr std::size_t kMinimumLength = 17;

// Transport channels: the count n is bits 6..11 of the 16 bits at 14; entry k is 2 bytes at 17 + 2k.
inline constexpr std::size_t kTransportChannelEntriesOffset = 17;
inline constexpr std::size_t kTransportChannelEntryLength = 2;
inline std::size_t transportChannelCount(const RecordReader& record) {
    return record.bits(14, 2, 6, 11);
}

// Coded composite channels: the count is bits 4..7 of byte 15; entry k is 8 bytes at 289 + 34n + 8k, behind a
// region taken as 34 bytes per transport channel.
inline constexpr std::size_t kCompositeChannelEntriesOffset = 289;
inline constexpr std::size_t kPerTransportChannelRegion = 34;
inline constexpr std::size_t kCompositeChannelEntryLength = 8;
inline std::size_t compositeChannelCount(const RecordReader& record) {
    return record.bits(15, 1, 4, 7);
}

}  // namespace velmar::utran_layout::channel_quality
