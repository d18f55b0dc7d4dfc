// ActiveSet: the "Active Set" list section: the cells of the UMTS active set, one row per cell of set type 0
// of the cell-set record 0x417A.
#pragma once

#include "LogGenerator/GSM/CellSetDecoder.h"

namespace velmar {

class ActiveSet : public CellSetDecoder {
  public:
    ActiveSet();
};

}  // namespace velmar
