// ActivityController: what the simulated device is doing. It powers on, searches, registers, and then
// alternates between idle periods and connections: PowerOn -> Registering -> Idle -> Connecting ->
// Connected -> Releasing -> Idle -> ... Dwell times are drawn per period: power-on 2-3 s, registration 3-5 s,
// the first idle period 6-10 s and later ones 10-40 s, connection set-up 0.2-0.5 s, connections 15-60 s,
// release 0.3-0.8 s. The first connection carries data; later ones carry data seven times in ten. A packet
// data context comes up with the first data connection and is dropped after half of the releases.
//
// Contract: advance() moves time on by one step and answers true when the phase changed at this step.
// While a data connection is up, throughput follows the serving cell's level smoothly (kbps, 0 otherwise).
#pragma once

#include <cstdint>

#include "service/sim/RadioSnapshot.h"
#include "service/sim/SimRandom.h"

namespace velmar::sim {

class ActivityController {
  public:
    explicit ActivityController(SimRandom& random);

    bool advance(double stepSeconds, double servingGainDb);

    ActivityPhase phase() const { return phase_; }
    double phaseTime() const { return phaseTime_; }
    bool dataSession() const { return dataSession_; }
    bool connectionCarriesData() const { return connectionData_; }
    double throughputKbps() const { return throughput_; }
    std::uint32_t connections() const { return connections_; }

  private:
    void enter(ActivityPhase phase);
    void nextPhase();

    SimRandom& random_;
    ActivityPhase phase_ = ActivityPhase::PowerOn;
    double phaseTime_ = 0;
    double dwell_ = 0;
    bool dataSession_ = false;
    bool connectionData_ = false;
    double throughput_ = 0;
    std::uint32_t connections_ = 0;
    std::uint32_t idlePeriods_ = 0;
};

}  // namespace velmar::sim
