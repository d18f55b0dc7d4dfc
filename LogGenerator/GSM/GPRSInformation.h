// GPRSInformation: GSM/UMTS record decoder for the GPRS/EDGE cell options and TBF parameters from 0x51F5,
// 0x7135, 0x51F6, 0x51FB, 0x51FD, 0x51F4 and 0x5137; key section "GPRS Information".
//
// Contract: created through Base::initWithDict; every call logs its entry line at warning priority, a record
// shorter than its code's minimum length leaves the section untouched, and an unbound decoder runs the same
// logic and logging but writes nowhere.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class GPRSInformation : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
