// MeasuredNeighborCells: the "Measured Neighbor Cells" list section, one row per measured neighbour of the
// connected-mode intra-frequency record 0xB179.
//
// Contract: the list is emptied, then rebuilt with the N entries (6 bytes each, from offset 29) that the
// record's count gives; a count of zero leaves it empty. The entries are read where the count puts them,
// whatever the record's length (bytes past its end read as zero).
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class MeasuredNeighborCells : public TableDecoder {
  public:
    MeasuredNeighborCells();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
