// CodingScheme: the "Coding Scheme" section, a placeholder that takes no codes and shows nothing.
#pragma once

#include "LogGenerator/GSM/PlaceholderDecoder.h"

namespace velmar {

class CodingScheme : public PlaceholderDecoder {
  public:
    CodingScheme() : PlaceholderDecoder("CodingScheme", "Coding Scheme") {}
};

}  // namespace velmar
