// SimulatedBaseband: the simulated phone in its small radio world, as one object that tests and the service's
// source drive alike. It owns the world (cells, route, propagation, procedures), advances it in fixed steps
// of simulated time and hands each step's snapshot to the technology's emitter.
//
// Contract: runUntil(t) advances simulated time to t seconds (never backwards; a smaller t does nothing) and
// passes every blob due by then to emit, in time order. The same settings give the same bytes, whatever the
// machine and however the calls to runUntil cut up time. Simulated time knows nothing of the wall clock: the
// service maps wall time to simulated time (times the rate multiplier).
#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "service/sim/RadioSnapshot.h"
#include "service/sim/SimRandom.h"
#include "service/sim/TechnologyEmitter.h"

namespace velmar::sim {

enum class Scenario : std::uint8_t { Drive, Walk, Static };

struct SimSettings {
    std::string technology = "lte";  // gsm, lte, utran, cdma or ifx
    std::uint64_t seed = 1;
    Scenario scenario = Scenario::Drive;
    // The baseband timestamp at simulated time 0 (1/800 s since 1980-01-06, shifted left by 16).
    std::uint64_t startTimestamp = 0;
};

class SimulatedBaseband {
  public:
    explicit SimulatedBaseband(const SimSettings& settings);
    ~SimulatedBaseband();

    void runUntil(double seconds, const BlobOutput& emit);
    const RadioSnapshot& snapshot() const;

  private:
    struct World;
    std::unique_ptr<World> world_;
};

}  // namespace velmar::sim
