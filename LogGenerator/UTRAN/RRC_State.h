// RRC_State: the "RRC Info" key section of the UTRAN display: the radio-resource-control state, from the
// record 0xD0E0.
//
// Contract: the length check is lenient: a record under 15 bytes is reported ("LogCode_0xD0E0 is length is
// %ld expected size %ld") and decoded all the same, its missing bytes reading as zero. The mode is byte 14
// when byte 13 is 1, otherwise 255 ("Unknown RRC Mode"). Other codes are ignored silently.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class RRC_State : public KeySectionDecoder {
  public:
    RRC_State();
};

}  // namespace velmar
