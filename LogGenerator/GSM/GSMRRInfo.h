// GSMRRInfo: GSM/UMTS record decoder for the GSM radio-resource state, mode, DTX/DRX and serving-cell quality
// from 0x512C, 0x5137, 0x5072 and 0x51F6; key section "GSM RR Info".
//
// Contract: created through Base::initWithDict; every call logs its entry line at warning priority, a record
// shorter than its code's minimum length leaves the section untouched, and an unbound decoder runs the same
// logic and logging but writes nowhere.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class GSMRRInfo : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
