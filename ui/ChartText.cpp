#include "ui/ChartText.h"

#include <algorithm>
#include <cmath>

#include "core/platform/StringFormat.h"

namespace velmar {

std::string formatReading(double value, int decimals, std::string_view unit) {
    std::string text = stringWithFormat("%.*f", std::clamp(decimals, 0, 9), value);
    if (text.front() == '-' && text.find_first_not_of("-0.") == std::string::npos) {
        text.erase(0, 1);  // "-0.00": a value that rounds to zero has no sign
    }
    if (unit.empty()) {
        return text;
    }
    return text + (unit == "%" ? "" : " ") + std::string(unit);
}

std::string formatSpan(double seconds) {
    if (seconds < 60.0) {
        return stringWithFormat("%d s", static_cast<int>(std::lround(seconds)));
    }
    return stringWithFormat("%d min", static_cast<int>(std::lround(seconds / 60.0)));
}

}  // namespace velmar
