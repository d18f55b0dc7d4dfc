// NonRankedUMTSSet: the "Non-Ranked UMTS Set" section, a placeholder that takes no codes and shows nothing.
#pragma once

#include "LogGenerator/GSM/PlaceholderDecoder.h"

namespace velmar {

class NonRankedUMTSSet : public PlaceholderDecoder {
  public:
    NonRankedUMTSSet() : PlaceholderDecoder("NonRankedUMTSSet", "Non-Ranked UMTS Set") {}
};

}  // namespace velmar
