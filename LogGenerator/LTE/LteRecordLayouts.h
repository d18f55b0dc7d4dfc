// LteRecordLayouts: the geometry of the LTE records that feed more than one decoder: where their counts and
// entries lie, and the minimum length below which every decoder of the record drops it. Offsets count from
// the first byte of the packet (the 13-byte header included).
#pragma once

#include <cstddef>
#include <cstdint>

namespace velmar::lte_layout {

// 0xB179, connected-mode intra-frequency measurements.
namespace intra_frequency {
inline constexpr std::size_t kMinimumLength = 29;
inline constexpr std::size_t kMeasuredCountOffset = 27;  // N
inline constexpr std::size_t kDetectedCountOffset = 28;  // D
inline constexpr std::size_t kEntriesOffset = 29;
inline constexpr std::size_t kMeasuredEntryLength = 6;
inline constexpr std::size_t kDetectedEntryLength = 2;
}  // namespace intra_frequency

// 0xB17F, idle-mode serving cell measurements.
namespace serving_measurement {
inline constexpr std::size_t kMinimumLength = 33;
}  // namespace serving_measurement

// 0xB180, idle-mode neighbour measurements: bits 6..10 of the 16 bits at 19 hold the cell count minus one.
namespace neighbor_measurement {
inline constexpr std::size_t kMinimumLength = 21;
inline constexpr std::size_t kCountOffset = 19;
inline constexpr unsigned kCountLowBit = 6;
inline constexpr unsigned kCountHighBit = 10;
inline constexpr std::size_t kEntriesOffset = 21;
inline constexpr std::size_t kEntryLength = 20;
}  // namespace neighbor_measurement

// 0xB186, idle-mode reselection candidates: only the low 8 bits of the 16-bit count at 19 are used.
namespace reselection {
inline constexpr std::size_t kMinimumLength = 21;
inline constexpr std::size_t kCountOffset = 19;
inline constexpr std::size_t kEntriesOffset = 21;
// The stride between candidates; a candidate's technology fields start right after its 4-byte header, in
// the next candidate's slot.
inline constexpr std::size_t kEntryStride = 4;
inline constexpr std::size_t kTechnologyFieldsOffset = 4;
}  // namespace reselection

}  // namespace velmar::lte_layout
