// GPRSInformation: the "GPRS Information" key section: the GPRS cell options, TBF and DRX parameters, PBCCH
// and packet system information status, and cell reselection hysteresis, from 0x51F5, 0x7135, 0x51F6, 0x51FB,
// 0x51FD, 0x51F4 and 0x5137.
//
// Contract: every call logs "GPRSInformation" at warning priority; other codes (those between the subscribed
// ones included) log "Received an unknown log message: %d"; records shorter than their code's minimum change
// nothing.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class GPRSInformation : public KeySectionDecoder {
  public:
    GPRSInformation();
};

}  // namespace velmar
