// GSMServingCell: the "GSM Serving Cell" key section: identity (0x5134), measurements (0x5137), the dedicated
// channel's ARFCN (0x5076) and the GSM serving cell of the cell-monitor record (0xFF0001).
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class GSMServingCell : public TableDecoder {
  public:
    GSMServingCell();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
