#include "LogGenerator/C2K/C2KPilotStrength.h"

#include <cmath>

namespace velmar::c2k {

namespace {
constexpr double kEvdoStrengthUnit = 0.001953125;  // 1/512
constexpr double kEnergyFloor = 0.00001;
}  // namespace

double evdoPilotStrengthDb(std::uint32_t raw) {
    return 10.0 * std::log10(raw * kEvdoStrengthUnit);
}

double activeSetPilotEnergyDb(std::uint32_t energy, std::uint32_t l, std::uint32_t m, std::uint32_t q) {
    const double scale = std::ldexp(1.0, 2 * static_cast<int>(q) - 3);
    const double lengths = static_cast<double>(l);
    const double linear = scale * energy / (9.0 * lengths * lengths * m) - 1.0 / lengths;
    // Written so that a result that is not a number falls to the floor as well.
    const double bounded = linear > kEnergyFloor ? linear : kEnergyFloor;
    return 10.0 * std::log10(bounded);
}

}  // namespace velmar::c2k
