// CellSetRecord: the connected-mode cell-set record 0x417A as the UMTS cell-set decoders read it.
//
// Layout: a signed 16-bit received-power reading at 13; N, the number of cells, at 15; N cell entries of 15
// bytes from 16 (byte 7: low 8 bits of the primary scrambling code; byte 8: its high 5 bits in bits 0..4 and
// the set type in bits 5..7); then N energy entries of 44 bytes in the same order, each with three 32-bit
// linear Ec/Io readings at +32, +36 and +40.
// Contract: cell(i) and energyReading(i) throw ArrayOutOfBoundsException for i >= N; they never compare N
// with the buffer's length (missing bytes read as zero).
#pragma once

#include <cstddef>
#include <cstdint>

#include "LogGenerator/GSM/CountedList.h"
#include "core/platform/RecordReader.h"

namespace velmar {

class CellSetRecord {
  public:
    static constexpr std::size_t kMinimumLength = 16;
    static constexpr std::uint32_t kActiveSetType = 0;

    struct Cell {
        std::uint32_t scramblingCode;  // 13 bits
        std::uint32_t setType;         // 3 bits
    };

    explicit CellSetRecord(ByteView data);

    std::int32_t powerReading() const { return record_.s16(13); }
    std::size_t cellCount() const { return cells_.count; }
    Cell cell(std::size_t index) const;
    // The first non-zero of the entry's three readings, in order; zero when all three are zero.
    std::uint32_t energyReading(std::size_t index) const;

  private:
    RecordReader record_;
    CountedList cells_;
    CountedList energies_;
};

}  // namespace velmar
