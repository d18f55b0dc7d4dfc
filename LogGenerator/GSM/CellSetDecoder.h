// CellSetDecoder: the common decoder of the four UMTS cell-set sections that read the connected-mode
// cell-set record 0x417A ("Active Set", "Detected Set", "Monitored Set", "Virtual Active Set").
//
// Contract: every record of at least 16 bytes empties the section and, when it lists cells, replaces the
// section's content with one row per cell of the active set type, in cell order, each with "Scrambling Code",
// "RSCP" and "Energy Per Chip". Only the active-set decoder produces rows: the other three walk the cells'
// set types and then install an empty list, so their sections are always empty after such a record. That is
// how the baseband's sets are shown and it is kept.
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class CellSetDecoder : public TableDecoder {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;

  protected:
    // Each call logs the decoder's class name.
    CellSetDecoder(const DecoderRow& row, bool listsActiveCells)
        : TableDecoder(row), listsActiveCells_(listsActiveCells) {}

  private:
    bool listsActiveCells_;
};

}  // namespace velmar
