// CCTRCHSIRMeasurement: the "CCTRCH SIR" list section, the signal-to-interference values of each coded
// composite transport channel of the record 0xD00C.
//
// Contract: a record under 17 bytes changes nothing; other codes are ignored silently. Entry k (8 bytes) lies
// at 289 + 34n + 8k, n being the transport-channel count; each shows exactly six SIR values.
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class CCTRCHSIRMeasurement : public TableDecoder {
  public:
    CCTRCHSIRMeasurement();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
