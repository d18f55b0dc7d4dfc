// ServingPLMN: the "Serving PLMN" key section, the network the phone is registered on: country and network
// codes digit by digit, area codes and service type from 0x7135, the selection mode from 0x7132, and the
// codes as plain numbers from the serving GSM or UMTS cell of the cell-monitor array (0xFF0001).
//
// Contract: every call logs "Serving PLMN" at warning priority; other codes log "Received an unknown log
// message: %d"; records shorter than their code's minimum change nothing. A key that one record does not
// write keeps its earlier value.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class ServingPLMN : public KeySectionDecoder {
  public:
    ServingPLMN();
};

}  // namespace velmar
