// CCTRCHSIRMeasurement: the "CCTRCH SIR" list section, the signal-to-interference values of each coded
// composite transport channel of the record 0xD00C.
//
// Contract: a record under 17 bytes changes nothing; other codes are ignored silently. Entry k (8 bytes) lies
// at 289 + 34n + 8k, n being the transport-channel count; each shows exactly six SIR values.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class CCTRCHSIRMeasurement : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
