// UTRANServingCellInfo: the "Serving Cell Info" key section of the UTRAN display: identity and channel
// numbers of the serving cell, from the record 0xD0E2 and from the telephony service's cell-monitor array
// (0xFF0001).
//
// Contract: a 0xD0E2 record under 26 bytes changes nothing. Every serving UTRAN cell of the cell-monitor
// array is decoded in array order, so the last one's values remain; its missing numbers are logged and leave
// their keys as they were. Other codes are ignored silently.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class UTRANServingCellInfo : public KeySectionDecoder {
  public:
    UTRANServingCellInfo();
};

}  // namespace velmar
