// ProcessCS: the "Process CS" key section, the circuit-switched (MM) mobility state: MM state, sub-state and
// location-update status from record 0x7131, and the registration state from 0x7132.
//
// Contract: every call logs "ProcessCS" at warning priority; other codes log "Received an unknown log
// message: %d"; records under 16 bytes change nothing.
#pragma once

#include "LogGenerator/Base.h"

namespace velmar {

class ProcessCS : public Base {
  public:
    void updateWithData(ByteView data, std::int32_t logCode) override;
    std::string_view getSectionName() const override;
    LogCodeArray getLogCodeArray() const override;
};

}  // namespace velmar
