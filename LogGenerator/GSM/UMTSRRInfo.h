// UMTSRRInfo: GSM/UMTS record decoder for the UMTS RRC state, cell identity and frequencies, ciphering and
// mean transmit power from 0x4125, 0x4031, 0x4127, 0x4157 and the cell-monitor array 0xFF0001; key section
// "UMTS RR Info".
//
// Contract: created through Base::initWithDict; every call logs its entry line at warning priority, a record
// shorter than its code's minimum length leaves the section untouched, and an unbound decoder runs the same
// logic and logging but writes nowhere.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class UMTSRRInfo : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
