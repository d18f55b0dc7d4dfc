// ChartText: the texts that both front ends' charts show beside their lines, so that they read alike.
//
// Contract: formatReading prints a value of a leaf as its pane prints the leaf's values: exactly the given
// number of decimals (0 to 9), then the unit after a blank, except "%" which follows at once ("-65.50 dBm",
// "12", "3.1%"); a value that rounds to zero prints without a minus sign. formatSpan names a time span in
// whole minutes from one minute on ("10 min", "60 min") and in seconds below it ("45 s").
#pragma once

#include <string>
#include <string_view>

namespace velmar {

std::string formatReading(double value, int decimals, std::string_view unit);
std::string formatSpan(double seconds);

}  // namespace velmar
