// ProcessCO: GSM/UMTS record decoder for common mobility view: the MM state of record 0x7131 and the
// registration state from 0x7132; key section "Process CO".
//
// Contract: created through Base::initWithDict; every call logs its entry line at warning priority, a record
// shorter than its code's minimum length leaves the section untouched, and an unbound decoder runs the same
// logic and logging but writes nowhere.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class ProcessCO : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
