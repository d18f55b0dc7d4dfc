// NeighboringCells: the "Neighboring Cells" list section: the GSM neighbour measurements (0x5137), each with
// the BSIC that the last BSIC list (0x51FF) gave for its ARFCN, or the GSM neighbours of the cell-monitor
// record (0xFF0001).
//
// Contract: every 0x51FF record replaces arfcnToBsic whole (a later duplicate ARFCN wins) and writes nothing
// to the section; a neighbour whose ARFCN is not in it has no "BSIC" key.
#pragma once

#include <cstdint>
#include <string>
#include <unordered_map>

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class NeighboringCells : public TableDecoder {
  public:
    NeighboringCells();
    void updateWithData(ByteView data, std::int32_t logCode) override;

  private:
    void updateBsicList(ByteView data);
    void updateNeighbourMeasurements(ByteView data);

    // ARFCN → "%d" of its BSIC. Keyed by the number rather than by its "%d" text: the two are one-to-one for
    // 16-bit ARFCNs, and the lookup needs no formatting.
    std::unordered_map<std::uint32_t, std::string> arfcnToBsic;
};

}  // namespace velmar
