// NeighborMeasurementMisc: the "Neighbor Measurements" key section, the scalars of the idle-mode neighbour
// measurement record 0xB180.
//
// Contract: a record under 21 bytes changes nothing; another code is reported as unknown.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class NeighborMeasurementMisc : public KeySectionDecoder {
  public:
    NeighborMeasurementMisc();
};

}  // namespace velmar
