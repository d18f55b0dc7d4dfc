// UTRANNeighbhorMeasurements: the "Neighbor Cell List" list section, one row per UTRAN neighbour cell of the
// record 0xD00A.
//
// Contract: a record under 21 bytes changes nothing; other codes are ignored silently. The count (0 to 127)
// is bits 1..7 of byte 16 and entry k is 16 bytes at 168 + 16k, read where the count puts it. A status of 3
// leaves the row without a "Status" key.
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class UTRANNeighbhorMeasurements : public TableDecoder {
  public:
    UTRANNeighbhorMeasurements();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
