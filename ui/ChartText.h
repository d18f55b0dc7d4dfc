// ChartText: the texts that both front ends' charts show beside their lines, so that they read alike.
//
// Contract: formatChartNumber writes a value with at most two decimals and no trailing zeros ("-101.25",
// "60", "3.5", "0"); with a unit it follows after a blank, except "%" which follows at once. formatSpan
// names a time span in whole minutes from one minute on ("10 min", "60 min") and in seconds below it
// ("45 s").
#pragma once

#include <string>
#include <string_view>

namespace velmar {

std::string formatChartNumber(double value, std::string_view unit = {});
std::string formatSpan(double seconds);

}  // namespace velmar
