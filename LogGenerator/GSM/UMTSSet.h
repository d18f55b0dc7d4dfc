// UMTSSet: the "UMTS Set" list section: the UMTS cells of the idle measurement record 0x4005 (UMTS count at
// byte 13, 10-byte entries from offset 15, the same offset at which GSMSet reads its GSM entries), or the
// UMTS neighbours of the cell-monitor record (0xFF0001).
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class UMTSSet : public TableDecoder {
  public:
    UMTSSet();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
