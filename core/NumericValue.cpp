#include "core/NumericValue.h"

#include <array>
#include <charconv>
#include <cmath>

namespace velmar {

namespace {

// The units that follow a number after one blank in the decoders' formats.
constexpr std::array<std::string_view, 5> kSpacedUnits = {"dBm", "dB", "kbps", "sec", "\xC3\x97 64chips"};
constexpr std::string_view kPercent = "%";
// More significant digits than a double holds exactly: an identity, not a quantity.
constexpr std::size_t kMostIntegerDigits = 15;

bool isBlank(char c) {
    return c == ' ' || c == '\t';
}
bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

std::string_view trim(std::string_view text) {
    while (!text.empty() && isBlank(text.front())) {
        text.remove_prefix(1);
    }
    while (!text.empty() && isBlank(text.back())) {
        text.remove_suffix(1);
    }
    return text;
}

// Drops one "(remark) " before and one " (remark)" after the rest of the text.
std::string_view withoutRemarks(std::string_view text) {
    if (!text.empty() && text.front() == '(') {
        const std::size_t close = text.find(") ");
        if (close != std::string_view::npos) {
            text = trim(text.substr(close + 2));
        }
    }
    if (!text.empty() && text.back() == ')') {
        const std::size_t open = text.rfind(" (");
        if (open != std::string_view::npos) {
            text = trim(text.substr(0, open));
        }
    }
    return text;
}

std::optional<std::string_view> knownUnit(std::string_view rest) {
    if (rest.empty()) {
        return std::string_view();
    }
    if (rest == kPercent) {
        return kPercent;
    }
    if (rest.front() != ' ') {
        return std::nullopt;
    }
    rest.remove_prefix(1);
    for (const std::string_view unit : kSpacedUnits) {
        if (rest == unit) {
            return unit;
        }
    }
    return std::nullopt;
}

}  // namespace

std::optional<NumericValue> parseNumericValue(std::string_view text) {
    text = withoutRemarks(trim(text));
    bool negative = false;
    bool plus = false;
    if (!text.empty() && (text.front() == '+' || text.front() == '-')) {
        negative = text.front() == '-';
        plus = !negative;
        text.remove_prefix(1);
    }
    std::size_t end = 0;
    std::size_t leadingZeros = 0;
    while (end < text.size() && isDigit(text[end])) {
        leadingZeros += leadingZeros == end && text[end] == '0';
        ++end;
    }
    if (end == 0 || end - leadingZeros > kMostIntegerDigits) {
        return std::nullopt;
    }
    int decimals = 0;
    if (end < text.size() && text[end] == '.') {
        std::size_t fraction = end + 1;
        while (fraction < text.size() && isDigit(text[fraction])) {
            ++fraction;
        }
        if (fraction == end + 1) {
            return std::nullopt;  // "12." is not a format of ours
        }
        decimals = static_cast<int>(fraction - end - 1);
        end = fraction;
    }
    const std::optional<std::string_view> unit = knownUnit(text.substr(end));
    if (!unit || (plus && unit->empty())) {
        return std::nullopt;
    }
    double magnitude = 0.0;
    const auto [last, error] = std::from_chars(text.data(), text.data() + end, magnitude);
    if (error != std::errc() || last != text.data() + end || !std::isfinite(magnitude)) {
        return std::nullopt;
    }
    // Adding 0.0 turns a negative zero ("-0.00 dB") into zero.
    return NumericValue{(negative ? -magnitude : magnitude) + 0.0, *unit, decimals};
}

}  // namespace velmar
