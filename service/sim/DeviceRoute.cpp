#include "service/sim/DeviceRoute.h"

#include <cmath>

namespace velmar::sim {

namespace {

constexpr double kTwoPi = 6.283185307179586;
constexpr double kMeanRadius = 520.0;
constexpr double kLobeDepth = 120.0;

double radiusAt(double angle) {
    return kMeanRadius + kLobeDepth * std::sin(3.0 * angle);
}

// |dp/dangle| of the polar curve r(angle).
double arcRate(double angle) {
    const double radius = radiusAt(angle);
    const double slope = 3.0 * kLobeDepth * std::cos(3.0 * angle);
    return std::sqrt(radius * radius + slope * slope);
}

}  // namespace

DeviceRoute::DeviceRoute(double speedMetresPerSecond, SimRandom& random)
    : speed_(speedMetresPerSecond), angle_(random.uniform(0.0, kTwoPi)) {
    place();
}

void DeviceRoute::advance(double seconds) {
    if (speed_ <= 0) {
        return;
    }
    const double distance = speed_ * seconds;
    // Midpoint rule: the angle advanced at the rate halfway along the step.
    const double midAngle = angle_ + 0.5 * distance / arcRate(angle_);
    angle_ += distance / arcRate(midAngle);
    if (angle_ >= kTwoPi) {
        angle_ -= kTwoPi;
    }
    travelled_ += distance;
    place();
}

void DeviceRoute::place() {
    const double radius = radiusAt(angle_);
    x_ = radius * std::cos(angle_);
    y_ = radius * std::sin(angle_);
}

}  // namespace velmar::sim
