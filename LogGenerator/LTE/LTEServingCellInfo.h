// LTEServingCellInfo: the "Serving Cell Info" key section of the LTE display: identity, channel numbers and
// bandwidths of the camped cell, from the serving-cell record 0xB0C2, the transmit-antenna count of 0xB0C1
// and the telephony service's cell-monitor array (0xFF0001). Whichever source wrote a key last wins.
//
// Contract: records shorter than their minimum (38 bytes for 0xB0C2, 22 for 0xB0C1) change nothing. 0xB0C2
// removes "UARFCN", which only the cell-monitor array writes. Every good 0xB0C1 record is followed by
// "Received an unknown log message: %d", as for a code this decoder does not know. The cell-monitor array is
// searched for the first serving LTE cell; its missing numbers are logged and leave their keys as they were.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class LTEServingCellInfo : public KeySectionDecoder {
  public:
    LTEServingCellInfo();
};

}  // namespace velmar
