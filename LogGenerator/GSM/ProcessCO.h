// ProcessCO: the "Process CO" key section, the common mobility view: the MM state of record 0x7131 and the
// registration state from 0x7132.
//
// Contract: every call logs "ProcessCS" at warning priority (the circuit-switched decoder's line, shared on
// purpose); other codes log "Received an unknown log message: %d"; records under 16 bytes change nothing.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class ProcessCO : public KeySectionDecoder {
  public:
    ProcessCO();
};

}  // namespace velmar
