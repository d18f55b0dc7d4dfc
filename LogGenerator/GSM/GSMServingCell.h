// GSMServingCell: the "GSM Serving Cell" key section: identity (0x5134), measurements (0x5137), the dedicated
// channel's ARFCN (0x5076) and the GSM serving cell of the cell-monitor record (0xFF0001).
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class GSMServingCell : public KeySectionDecoder {
  public:
    GSMServingCell();
};

}  // namespace velmar
