// TRCHBLERMeasurement: the "TRCH BLER" list section, the block error rate of each transport channel of the
// record 0xD00C.
//
// Contract: its title is logged at notice priority. A record under 17 bytes changes nothing; other codes are
// ignored silently. The n entries (n from bits 6..11 of the 16 bits at 14) are 2 bytes each from offset 17.
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class TRCHBLERMeasurement : public TableDecoder {
  public:
    TRCHBLERMeasurement();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
