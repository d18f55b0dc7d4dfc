// CellChangeCounters: the "Cell Change Counters" section, a placeholder that takes no codes and shows
// nothing; called anyway, it only logs "CellChangeCounters" at warning priority.
#pragma once

#include "LogGenerator/GSM/PlaceholderDecoder.h"

namespace velmar {

class CellChangeCounters : public PlaceholderDecoder {
  public:
    CellChangeCounters();
};

}  // namespace velmar
