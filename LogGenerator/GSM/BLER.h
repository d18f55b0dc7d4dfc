// BLER: GSM/UMTS record decoder for the block error counts per transport channel of record 0x4116; key
// section "BLER" whose channel list is an array value written directly.
//
// Contract: created through Base::initWithDict; every call logs its entry line at warning priority, a record
// shorter than its code's minimum length leaves the section untouched, and an unbound decoder runs the same
// logic and logging but writes nowhere.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class BLER : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
