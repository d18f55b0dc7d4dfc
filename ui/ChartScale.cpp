#include "ui/ChartScale.h"

#include <algorithm>
#include <array>
#include <cmath>

#include "core/platform/Clock.h"

namespace velmar {

namespace {
// Float noise in a division is no reason for another step.
constexpr double kSlack = 1e-9;
}  // namespace

int AxisScale::decimals() const {
    // The fewest decimals that write the step exactly (2.5 needs one, 0.25 two), three at most.
    double scaled = step;
    for (int decimals = 0; decimals < 3; ++decimals, scaled *= 10.0) {
        if (std::fabs(scaled - std::round(scaled)) < 1e-6 * std::max(1.0, std::fabs(scaled))) {
            return decimals;
        }
    }
    return 3;
}

AxisScale niceScale(double low, double high, int maxTicks) {
    // Three labels hold any range once the step is as wide as the range; two would not hold one across zero.
    maxTicks = std::max(3, maxTicks);
    if (!std::isfinite(low) || !std::isfinite(high) || !std::isfinite(high - low)) {
        return {};
    }
    if (high < low) {
        std::swap(low, high);
    }
    if (high - low < kSlack) {
        const double pad = std::max(1.0, std::fabs(low) * 0.05);
        low -= pad;
        high += pad;
    }
    const double raw = (high - low) / (maxTicks - 1);
    double magnitude = std::pow(10.0, std::floor(std::log10(raw)));
    for (int attempt = 0; attempt < 40; ++attempt) {
        for (const double multiple : {1.0, 2.0, 2.5, 5.0}) {
            const double step = multiple * magnitude;
            const double from = std::floor(low / step + kSlack) * step;
            const double to = std::ceil(high / step - kSlack) * step;
            const int ticks = static_cast<int>(std::lround((to - from) / step)) + 1;
            if (ticks <= maxTicks) {
                return {from, to, step, std::max(2, ticks)};
            }
        }
        magnitude *= 10.0;
    }
    return {low, high, high - low, 2};  // not reached: a step as wide as the range fits in three
}

TimeTicks timeTicks(double start, double end, int maxLabels) {
    static constexpr std::array<double, 13> kSteps = {1,   2,   5,   10,  15,   30,  60,
                                                      120, 300, 600, 900, 1800, 3600};
    TimeTicks ticks;
    maxLabels = std::max(1, maxLabels);
    if (!std::isfinite(start) || !std::isfinite(end) || end < start) {
        return ticks;
    }
    ticks.step = kSteps.back();
    for (const double step : kSteps) {
        if ((end - start) / step <= maxLabels) {
            ticks.step = step;
            break;
        }
    }
    ticks.format = ticks.step < 60.0 ? "%H:%M:%S" : "%H:%M";
    const double offset =
        static_cast<double>(Clock::localZoneAt(static_cast<std::int64_t>(start)).utcOffsetSeconds);
    // The step keeps the count near maxLabels; the bound guards against spans beyond the longest step.
    const auto most = static_cast<std::size_t>(maxLabels) + 2;
    for (double local = std::ceil((start + offset) / ticks.step - kSlack) * ticks.step;
         local - offset <= end + kSlack && ticks.instants.size() < most; local += ticks.step) {
        ticks.instants.push_back(local - offset);
    }
    return ticks;
}

}  // namespace velmar
