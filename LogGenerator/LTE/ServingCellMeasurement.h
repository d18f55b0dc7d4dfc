// ServingCellMeasurement: the "Serving Cell Measurements" key section, decoded from the idle-mode serving
// cell measurement record 0xB17F.
//
// Contract: a record under 33 bytes changes nothing; another code is reported as unknown. "Not Present" is
// shown for P_Max 64 and for the search thresholds 32; "Max UE Tx Power" is a 6-bit field compared with 64,
// so it never shows it.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class ServingCellMeasurement : public KeySectionDecoder {
  public:
    ServingCellMeasurement();
};

}  // namespace velmar
