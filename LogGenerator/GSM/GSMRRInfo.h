// GSMRRInfo: the "GSM RR Info" key section: GSM RR state, sub-state, status and mode (0x512C), serving level
// and the two quality words (0x5137), DTX (0x5072) and DRX (0x51F6).
//
// Contract: every call logs "GSMRRInfo" at warning priority; other codes log "Received an unknown log
// message: %d"; records shorter than their code's minimum change nothing.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class GSMRRInfo : public KeySectionDecoder {
  public:
    GSMRRInfo();
};

}  // namespace velmar
