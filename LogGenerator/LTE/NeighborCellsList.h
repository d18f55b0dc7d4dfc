// NeighborCellsList: the "Neighbor Cells List" list section, one row per neighbour cell of the idle-mode
// neighbour measurement record 0xB180.
//
// Contract: the record reports 1 to 32 cells (its count field holds the number minus one); the list is
// emptied, then rebuilt with that many 20-byte entries from offset 21, read where the count puts them. The
// neighbour levels are scaled by half a dB, and the antenna-1 offsets repeat the antenna-0 bits.
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class NeighborCellsList : public TableDecoder {
  public:
    NeighborCellsList();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
