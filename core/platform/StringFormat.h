// StringFormat: printf-style formatting into a std::string, the one way values become display text.
#pragma once

#include <string>

namespace velmar {

std::string stringWithFormat(const char* format, ...) __attribute__((format(printf, 1, 2)));

}  // namespace velmar
