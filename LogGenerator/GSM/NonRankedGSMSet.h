// NonRankedGSMSet: the "Non-Ranked GSM Set" section, a placeholder that takes no codes and shows nothing.
#pragma once

#include "LogGenerator/GSM/PlaceholderDecoder.h"

namespace velmar {

class NonRankedGSMSet : public PlaceholderDecoder {
  public:
    NonRankedGSMSet();
};

}  // namespace velmar
