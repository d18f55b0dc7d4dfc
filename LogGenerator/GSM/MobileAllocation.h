// MobileAllocation: the "Mobile Allocation" key section: the hopping sequence number and the list of hopping
// frequencies of record 0x51F8.
//
// Contract: "ARFCNs" holds an array of strings (not one string), written straight into the key section
// without the array lock, as key sections are.
#pragma once

#include "LogGenerator/KeySectionDecoder.h"

namespace velmar {

class MobileAllocation : public KeySectionDecoder {
  public:
    MobileAllocation();
};

}  // namespace velmar
