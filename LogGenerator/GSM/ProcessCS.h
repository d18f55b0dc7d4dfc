// ProcessCS: the "Process CS" key section, the circuit-switched (MM) mobility state: MM state, sub-state and
// location-update status from record 0x7131, and the registration state from 0x7132.
//
// Contract: every call logs "ProcessCS" at warning priority; other codes log "Received an unknown log
// message: %d"; records under 16 bytes change nothing.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class ProcessCS : public KeySectionDecoder {
  public:
    ProcessCS();
};

}  // namespace velmar
