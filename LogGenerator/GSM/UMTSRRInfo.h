// UMTSRRInfo: the "UMTS RR Info" key section: RRC state (0x4125), mean uplink transmit power (0x4031), cell
// identity, frequencies and URA (0x4127), ciphering (0x4157) and the serving UMTS cell of the cell-monitor
// array (0xFF0001).
//
// Contract: every call logs "UMTSRRInfo" at warning priority; other codes log "Received an unknown log
// message: %d"; records shorter than their code's minimum change nothing. 0x4127 removes the "UARFCN" that
// the cell-monitor array wrote; the next cell-monitor record writes it again.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class UMTSRRInfo : public KeySectionDecoder {
  public:
    UMTSRRInfo();
};

}  // namespace velmar
