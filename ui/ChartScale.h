// ChartScale: where a chart puts its labels, the same in both front ends: value axes on round numbers, time
// axes on round local clock times.
//
// Contract: niceScale widens [low, high] to whole steps of 1, 2, 2.5 or 5 times a power of ten, with at
// most maxTicks labels (at least 3); a flat or empty range is opened around its value first. timeTicks gives
// the instants in [start, end] that are whole multiples of the first step of 1, 2, 5, 10, 15, 30 seconds, 1,
// 2, 5, 10, 15, 30 minutes or 1 hour that yields at most maxLabels of them, counted in local time (so ticks
// fall on 14:05, 14:10, ... whatever the zone), with the strftime format to label them ("%H:%M:%S" below a
// minute, "%H:%M" from a minute on).
#pragma once

#include <string>
#include <vector>

namespace velmar {

struct AxisScale {
    double low = 0.0;
    double high = 1.0;
    double step = 1.0;
    int ticks = 2;
    // The fewest decimals that write every label exactly (those of the step), three at most.
    int decimals() const;
};

AxisScale niceScale(double low, double high, int maxTicks);

struct TimeTicks {
    std::vector<double> instants;  // seconds since 1970
    double step = 60.0;
    const char* format = "%H:%M";
};

TimeTicks timeTicks(double start, double end, int maxLabels);

}  // namespace velmar
