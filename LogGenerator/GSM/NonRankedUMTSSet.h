// NonRankedUMTSSet: the "Non-Ranked UMTS Set" section, a placeholder that takes no codes and shows nothing.
#pragma once

#include "LogGenerator/GSM/PlaceholderDecoder.h"

namespace velmar {

class NonRankedUMTSSet : public PlaceholderDecoder {
  public:
    NonRankedUMTSSet();
};

}  // namespace velmar
