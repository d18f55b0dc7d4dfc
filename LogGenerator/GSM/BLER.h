// BLER: the "BLER" key section: the window size and the CRC counts per transport channel of record 0x4116,
// the channels as an array value of the section (stored even when empty).
//
// Contract: every call logs "BLER" at warning priority; other codes log "Received an unknown log message:
// %d"; a record under 16 bytes changes nothing. The count is not checked against the record's length:
// entries past the end read as zeros.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class BLER : public KeySectionDecoder {
  public:
    BLER();
};

}  // namespace velmar
