// DetectedSet: the "Detected Set" list section: the UMTS detected set; always empty after a cell-set record
// 0x417A (see CellSetDecoder).
#pragma once

#include "LogGenerator/GSM/CellSetDecoder.h"

namespace velmar {

class DetectedSet : public CellSetDecoder {
  public:
    DetectedSet();
};

}  // namespace velmar
