// GSMSet: the "GSM Set" list section: the GSM cells that the phone measures while on UMTS, from the idle
// measurement record 0x4005 (GSM count at byte 14, 7-byte entries from offset 15).
//
// Contract: the GSM entries start at the same offset 15 as the UMTS entries that UMTSSet reads from the same
// record; the two views deliberately share that offset.
#pragma once

#include "LogGenerator/DecoderTable.h"

namespace velmar {

class GSMSet : public TableDecoder {
  public:
    GSMSet();
    void updateWithData(ByteView data, std::int32_t logCode) override;
};

}  // namespace velmar
