// NeighborMeasurementMisc: the "Neighbor Measurements" key section, the scalars of the idle-mode neighbour
// measurement record 0xB180.
//
// Contract: a record under 21 bytes changes nothing; another code is reported as unknown.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class NeighborMeasurementMisc : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
