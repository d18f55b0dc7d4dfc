// ServingPLMN: GSM/UMTS record decoder for the registered network: codes, area codes and service type from
// 0x7135, the selection mode from 0x7132, and the serving cell's codes from the cell-monitor array 0xFF0001;
// key section "Serving PLMN".
//
// Contract: created through Base::initWithDict; every call logs its entry line at warning priority, a record
// shorter than its code's minimum length leaves the section untouched, and an unbound decoder runs the same
// logic and logging but writes nowhere.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class ServingPLMN : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
