// CodingScheme: the "Coding Scheme" section, a placeholder that takes no codes and shows nothing; called
// anyway, it only logs "CodingScheme" at warning priority.
#pragma once

#include "LogGenerator/GSM/PlaceholderDecoder.h"

namespace velmar {

class CodingScheme : public PlaceholderDecoder {
  public:
    CodingScheme();
};

}  // namespace velmar
