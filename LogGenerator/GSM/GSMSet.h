// GSMSet: the "GSM Set" list section: the GSM cells that the phone measures while on UMTS, from the idle
// measurement record 0x4005 (GSM count at byte 14, 7-byte entries from offset 15).
//
// Contract: the GSM entries start at the same offset 15 as the UMTS entries that UMTSSet reads from the same
// record; the two views deliberately share that offset.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class GSMSet : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
