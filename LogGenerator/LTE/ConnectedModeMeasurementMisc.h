// ConnectedModeMeasurementMisc: the "Connected mode LTE Intra-frequency Measurement" key section, the
// serving-cell scalars of the connected-mode intra-frequency record 0xB179.
//
// Contract: a record under 29 bytes changes nothing; another code is reported as unknown.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class ConnectedModeMeasurementMisc : public KeySectionDecoder {
  public:
    ConnectedModeMeasurementMisc();
};

}  // namespace velmar
