// UMTSRRMeasurement: the "UMTS RR Measurement" section, a placeholder that takes no codes and shows nothing;
// called anyway, it only logs "UMTSRRMeasurement" at warning priority.
#pragma once

#include "LogGenerator/GSM/PlaceholderDecoder.h"

namespace velmar {

class UMTSRRMeasurement : public PlaceholderDecoder {
  public:
    UMTSRRMeasurement();
};

}  // namespace velmar
