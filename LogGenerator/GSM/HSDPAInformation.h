// HSDPAInformation: GSM/UMTS record decoder for the HSDPA carrier configuration and per-HARQ-process counters
// of record 0x4221; key section "HSDPA Info" whose process lists are array values written directly.
//
// Contract: created through Base::initWithDict; every call logs its entry line at warning priority, a record
// shorter than its code's minimum length leaves the section untouched, and an unbound decoder runs the same
// logic and logging but writes nowhere.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class HSDPAInformation : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
