// CellChangeCounters: the "Cell Change Counters" section, a placeholder that takes no codes and shows
// nothing.
#pragma once

#include "LogGenerator/GSM/PlaceholderDecoder.h"

namespace velmar {

class CellChangeCounters : public PlaceholderDecoder {
  public:
    CellChangeCounters() : PlaceholderDecoder("CellChangeCounters", "Cell Change Counters") {}
};

}  // namespace velmar
