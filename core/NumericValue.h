// NumericValue: whether a display value reads as a number, for the history of values that the charts draw.
//
// Contract: a value reads as a number when, after blanks at either end are trimmed, it is a decimal number
// (optional sign, digits, optional fraction; as the decoders' "%d", "%u", "%ld", "%+d", "%f", "%4.2f" and
// "%+.2f" print them), optionally followed by one of the units those formats print: "%" directly after the
// digits, or one blank and then "dBm", "dB", "kbps", "sec" or "× 64chips". A remark in parentheses before or
// after it ("(ref pilot) +10.00 dB", "1.56% (old)") is not part of the number and is left out. Everything
// else is not a number: texts such as "Not Present", "N/A", "Unknown", bracketed raw values ("[Reserved 3]"),
// hexadecimal identities ("0x0a1b2c"), addresses, and the names of value tables even where they begin with
// digits ("10 MHz", "500 ms", "1 to 3", "800 MHz cellular band [0]"), whose units no printf format of ours
// prints. Digit strings that are identities rather than quantities are not numbers either: more than 15
// significant digits before the point (a SIM's ICCID; a double would not even hold them exactly), and a "+"
// without a unit (a subscriber number: our "%+" formats all print a unit). The unit returned refers to static
// storage, never to the text parsed.
#pragma once

#include <optional>
#include <string_view>

namespace velmar {

struct NumericValue {
    double value = 0.0;
    // "" for a plain number.
    std::string_view unit;
    // Digits after the point as printed ("-99.75 dBm": 2, "12": 0), to print other values of the same leaf
    // alike.
    int decimals = 0;
};

std::optional<NumericValue> parseNumericValue(std::string_view text);

}  // namespace velmar
