// DetectedCells: the "Detected Cells" list section, one row per detected cell of the connected-mode
// intra-frequency record 0xB179.
//
// Contract: the list is emptied, then rebuilt with the D entries (2 bytes each) that follow the N measured-
// neighbour entries; a count of zero leaves it empty. Entries are read where the counts put them.
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class DetectedCells : public TableDecoder {
  public:
    DetectedCells();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
