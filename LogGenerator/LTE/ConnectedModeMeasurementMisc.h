// ConnectedModeMeasurementMisc: the "Connected mode LTE Intra-frequency Measurement" key section, the
// serving-cell scalars of the connected-mode intra-frequency record 0xB179.
//
// Contract: a record under 29 bytes changes nothing; another code is reported as unknown.
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class ConnectedModeMeasurementMisc : public TableDecoder {
  public:
    ConnectedModeMeasurementMisc();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
