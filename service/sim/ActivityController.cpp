#include "service/sim/ActivityController.h"

#include <algorithm>

namespace velmar::sim {

ActivityController::ActivityController(SimRandom& random) : random_(random) {
    enter(ActivityPhase::PowerOn);
}

void ActivityController::enter(ActivityPhase phase) {
    phase_ = phase;
    phaseTime_ = 0;
    switch (phase) {
        case ActivityPhase::PowerOn:
            dwell_ = random_.uniform(2.0, 3.0);
            break;
        case ActivityPhase::Registering:
            dwell_ = random_.uniform(3.0, 5.0);
            break;
        case ActivityPhase::Idle:
            dwell_ = idlePeriods_ == 0 ? random_.uniform(6.0, 10.0) : random_.uniform(10.0, 40.0);
            ++idlePeriods_;
            break;
        case ActivityPhase::Connecting:
            dwell_ = random_.uniform(0.2, 0.5);
            connectionData_ = connections_ == 0 || random_.chance(0.7);
            ++connections_;
            break;
        case ActivityPhase::Connected:
            dwell_ = random_.uniform(15.0, 60.0);
            if (connectionData_) {
                dataSession_ = true;
            }
            break;
        case ActivityPhase::Releasing:
            dwell_ = random_.uniform(0.3, 0.8);
            break;
    }
}

bool ActivityController::advance(double stepSeconds, double servingGainDb) {
    phaseTime_ += stepSeconds;
    const bool changed = phaseTime_ + 1e-9 >= dwell_;
    if (changed) {
        nextPhase();
    }
    if (phase_ == ActivityPhase::Connected && connectionData_) {
        // Roughly what the link carries at this level, with some wander of the cell's load.
        const double target =
            std::clamp((servingGainDb + 135.0) * 1200.0, 150.0, 60000.0) * random_.uniform(0.7, 1.0);
        throughput_ += 0.05 * (target - throughput_);
    } else {
        throughput_ = 0;
    }
    return changed;
}

void ActivityController::nextPhase() {
    switch (phase_) {
        case ActivityPhase::PowerOn:
            enter(ActivityPhase::Registering);
            break;
        case ActivityPhase::Registering:
            enter(ActivityPhase::Idle);
            break;
        case ActivityPhase::Idle:
            enter(ActivityPhase::Connecting);
            break;
        case ActivityPhase::Connecting:
            enter(ActivityPhase::Connected);
            break;
        case ActivityPhase::Connected:
            enter(ActivityPhase::Releasing);
            break;
        case ActivityPhase::Releasing:
            if (dataSession_ && random_.chance(0.5)) {
                dataSession_ = false;
            }
            enter(ActivityPhase::Idle);
            break;
    }
}

}  // namespace velmar::sim
