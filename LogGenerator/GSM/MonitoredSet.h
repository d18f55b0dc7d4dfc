// MonitoredSet: the "Monitored Set" list section: the UMTS monitored set; always empty after a cell-set
// record 0x417A (see CellSetDecoder).
#pragma once

#include "LogGenerator/GSM/CellSetDecoder.h"

namespace velmar {

class MonitoredSet : public CellSetDecoder {
  public:
    MonitoredSet();
};

}  // namespace velmar
