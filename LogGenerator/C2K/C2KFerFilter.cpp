#include "LogGenerator/C2K/C2KFerFilter.h"

#include "LogGenerator/C2K/C2KStateKeys.h"

namespace velmar::c2k {

std::optional<double> storedTrafficFer(const PlistDictionary& state) {
    const PlistValue* stored = state.find(kTrafficFerKey);
    if (stored == nullptr) {
        return std::nullopt;
    }
    if (const auto real = stored->realValue()) {
        return real;
    }
    if (const auto integer = stored->integerValue()) {
        return static_cast<double>(*integer);
    }
    return std::nullopt;
}

}  // namespace velmar::c2k
