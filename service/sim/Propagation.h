// Propagation: the path gain from every cell's transmitter to the device. Three parts add up in dB:
// - distance loss of an urban macro cell (log-distance, 37.6 dB per decade) plus the sector antenna's gain
//   and horizontal pattern (65 degree beam, 20 dB front-to-back), less the vehicle's or building's loss;
// - log-normal shadowing of 8 dB per site, spatially correlated along the device's path (decorrelation
//   distance 50 m, smoothed over 15 m; it stays put while the device stands still);
// - Rician fast fading per cell, whose correlation from step to step follows the device's speed, filtered
//   like a receiver's measurement filter so that the figures move smoothly.
//
// Contract: update() is called once per simulation step with the device's position, the distance it moved
// and the step's length; gains are then read per cell index. Randomness comes only from the given generator,
// in a fixed order, so that the same sequence of calls gives the same gains.
#pragma once

#include <vector>

#include "service/sim/RadioSnapshot.h"
#include "service/sim/SimRandom.h"

namespace velmar::sim {

class Propagation {
  public:
    static constexpr double kShadowingSigmaDb = 8.0;
    static constexpr double kShadowingDecorrelationMetres = 50.0;

    Propagation(const std::vector<SimCell>& cells, const std::vector<int>& sectorOf, SimRandom& random);

    void update(double x, double y, double movedMetres, double stepSeconds, double speed);

    double pathGainDb(int cell) const { return states_[static_cast<std::size_t>(cell)].gainDb; }
    double fastFadingDb(int cell) const { return states_[static_cast<std::size_t>(cell)].fadingDb; }

  private:
    void updateGeometry(double x, double y);

    struct CellState {
        double x = 0, y = 0;
        double azimuthRadians = 0;
        double frequencyLossDb = 0;       // distance loss at 1 km for the cell's band
        int site = 0;                     // index into shadowing_
        double meanDb = -200;             // antenna gain and pattern less distance and clutter loss
        double fadingI = 1, fadingQ = 0;  // the diffuse part of the Rician channel
        double fadingDb = 0;              // filtered fast fading
        double fadingStepDb = 0;          // its change per step until the next draw
        double gainDb = -200;
    };

    SimRandom& random_;
    std::vector<CellState> states_;
    std::vector<double> shadowing_;          // per site, dB
    std::vector<double> smoothedShadowing_;  // the same, smoothed over a few metres
    unsigned updates_ = 0;
    double movedSinceGeometry_ = 0;
};

}  // namespace velmar::sim
