#include "ui/ChartText.h"

#include <cmath>

#include "core/platform/StringFormat.h"

namespace velmar {

std::string formatChartNumber(double value, std::string_view unit) {
    std::string text = stringWithFormat("%.2f", value);
    while (text.back() == '0') {
        text.pop_back();
    }
    if (text.back() == '.') {
        text.pop_back();
    }
    if (text == "-0") {
        text = "0";
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
