// GSMNeighbhorMeasurements: the "GSM Neighbor Cell List" list section, from the GSM neighbour record 0xD00E.
//
// Contract: a record under 17 bytes changes nothing; other codes are ignored silently. Every good record
// empties the list; the rows are decoded but never installed, so the list always stays empty.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class GSMNeighbhorMeasurements : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
