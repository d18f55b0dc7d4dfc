// VirtualActiveSet: the "Virtual Active Set" list section: the UMTS virtual active set; always empty after a
// cell-set record 0x417A (see CellSetDecoder).
#pragma once

#include "LogGenerator/GSM/CellSetDecoder.h"

namespace velmar {

class VirtualActiveSet : public CellSetDecoder {
  public:
    VirtualActiveSet();
};

}  // namespace velmar
