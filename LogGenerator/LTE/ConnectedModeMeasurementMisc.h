// ConnectedModeMeasurementMisc: the "Connected mode LTE Intra-frequency Measurement" key section, the
// serving-cell scalars of the connected-mode intra-frequency record 0xB179.
//
// Contract: a record under 29 bytes changes nothing; another code is reported as unknown.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class ConnectedModeMeasurementMisc : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
