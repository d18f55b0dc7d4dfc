// DeviceRoute: where the simulated device is. It travels a closed loop through the cell grid (a rounded
// three-lobed curve that passes close to the inner ring of sites) at the scenario's speed: 50 km/h driving,
// 5 km/h walking, or standing still.
//
// Contract: advance(dt) moves the device by speed × dt along the loop, always in the same direction; the
// start point on the loop comes from the seed. Positions are in metres, in the grid's frame.
#pragma once

#include "service/sim/SimRandom.h"

namespace velmar::sim {

class DeviceRoute {
  public:
    static constexpr double kDriveSpeed = 50.0 / 3.6;  // metres per second
    static constexpr double kWalkSpeed = 5.0 / 3.6;

    DeviceRoute(double speedMetresPerSecond, SimRandom& random);

    void advance(double seconds);
    double x() const { return x_; }
    double y() const { return y_; }
    double speed() const { return speed_; }
    double travelled() const { return travelled_; }

  private:
    void place();

    double speed_;
    double angle_;  // position on the loop, radians
    double x_ = 0;
    double y_ = 0;
    double travelled_ = 0;
};

}  // namespace velmar::sim
