// ProcessPS: the "Process PS" key section, the packet-switched (GMM) mobility state: GMM state, sub-state and
// update status from record 0x7130, and the registration state from 0x7132.
//
// Contract: every call logs "ProcessPS" at warning priority; other codes log "Received an unknown log
// message: %d"; records under 16 bytes change nothing. Values are names from the state tables ("Unknown"
// beyond them).
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class ProcessPS : public KeySectionDecoder {
  public:
    ProcessPS();
};

}  // namespace velmar
