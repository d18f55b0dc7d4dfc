// GSMNeighbhorMeasurements: the "GSM Neighbor Cell List" list section, from the GSM neighbour record 0xD00E.
//
// Contract: a record under 17 bytes changes nothing; other codes are ignored silently. Every good record
// empties the list; the rows are decoded but never installed, so the list always stays empty.
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class GSMNeighbhorMeasurements : public TableDecoder {
  public:
    GSMNeighbhorMeasurements();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
