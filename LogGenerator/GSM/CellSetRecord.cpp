#include "LogGenerator/GSM/CellSetRecord.h"

namespace velmar {

namespace {

constexpr std::size_t kCellCountOffset = 15;
constexpr std::size_t kCellListOffset = 16;
constexpr std::size_t kCellEntrySize = 15;
constexpr std::size_t kScramblingCodeOffset =
    7;  // 16-bit little-endian word: code bits 0..12, set type 13..15
constexpr std::size_t kEnergyEntrySize = 44;
constexpr std::size_t kEnergyReadingOffsets[] = {32, 36, 40};

}  // namespace

CellSetRecord::CellSetRecord(ByteView data) : record_(data), cells_{}, energies_{} {
    const std::size_t count = record_.u8(kCellCountOffset);
    cells_ = CountedList{kCellListOffset, kCellEntrySize, count};
    energies_ = CountedList{kCellListOffset + kCellEntrySize * count, kEnergyEntrySize, count};
}

CellSetRecord::Cell CellSetRecord::cell(std::size_t index) const {
    const std::size_t at = cells_.elementOffset(index) + kScramblingCodeOffset;
    return Cell{record_.bits(at, 2, 0, 12), record_.bits(at, 2, 13, 15)};
}

std::uint32_t CellSetRecord::energyReading(std::size_t index) const {
    const std::size_t at = energies_.elementOffset(index);
    for (const std::size_t offset : kEnergyReadingOffsets) {
        if (const std::uint32_t reading = record_.u32(at + offset); reading != 0) {
            return reading;
        }
    }
    return 0;
}

}  // namespace velmar
