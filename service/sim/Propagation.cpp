#include "service/sim/Propagation.h"

#include <algorithm>
#include <cmath>

namespace velmar::sim {

namespace {

constexpr double kPi = 3.141592653589793;
constexpr double kMinimumDistance = 35.0;  // metres; closer than this the antenna's vertical pattern rules
constexpr double kAntennaGainDb = 12.0;    // sector antenna gain less cable losses
constexpr double kClutterLossDb = 14.0;    // vehicle or building penetration and the user's body
constexpr double kBeamwidthDegrees = 65.0;
constexpr double kFrontToBackDb = 20.0;
constexpr double kRicianK = 3.0;       // power of the direct part over the diffuse part
constexpr double kFadingFilter = 0.4;  // per draw of the fading, every 100 ms
constexpr unsigned kFadingEvery = 5;
// The shadowing is smoothed over this distance, as a building's shadow has no sharp edge.
constexpr double kShadowingSmoothingMetres = 15.0;

// Distance loss and antenna pattern change little within a few metres: they are recomputed every fifth
// step (every 100 ms, 1.4 m at driving speed), which keeps the per-step cost to the fading alone.
constexpr unsigned kGeometryEvery = 5;
// Cells this far below the hearing threshold cannot be heard whatever their fading, which then rests.
constexpr double kInaudibleDb = -150.0;

// A standard normal number from the sum of four uniform ones (Irwin-Hall): close enough for the
// innovations of the fading and shadowing processes, and far cheaper than Box-Muller on every step.
double normal(SimRandom& random) {
    const double sum = random.uniform() + random.uniform() + random.uniform() + random.uniform();
    return (sum - 2.0) * 1.7320508075688772;  // variance 4/12 scaled to 1
}

double lossAtOneKilometre(CellRat rat) {
    // GSM 900 loses 7 dB less than the bands around 2 GHz.
    return rat == CellRat::Gsm ? 120.9 : 128.1;
}

}  // namespace

Propagation::Propagation(const std::vector<SimCell>& cells, const std::vector<int>& sectorOf,
                         SimRandom& random)
    : random_(random) {
    states_.resize(cells.size());
    for (std::size_t index = 0; index < cells.size(); ++index) {
        CellState& state = states_[index];
        state.x = cells[index].x;
        state.y = cells[index].y;
        state.azimuthRadians = (30.0 + 120.0 * sectorOf[index]) * kPi / 180.0;
        state.frequencyLossDb = lossAtOneKilometre(cells[index].rat);
        // Cells at the same position share a site and so their shadowing.
        int site = -1;
        for (std::size_t other = 0; other < index; ++other) {
            if (states_[other].x == state.x && states_[other].y == state.y) {
                site = states_[other].site;
                break;
            }
        }
        if (site < 0) {
            site = static_cast<int>(shadowing_.size());
            shadowing_.push_back(kShadowingSigmaDb * random_.gaussian());
        }
        state.site = site;
        smoothedShadowing_.resize(shadowing_.size());
        smoothedShadowing_[static_cast<std::size_t>(site)] = shadowing_[static_cast<std::size_t>(site)];
        state.fadingI = random_.gaussian() * std::sqrt(0.5);
        state.fadingQ = random_.gaussian() * std::sqrt(0.5);
    }
}

void Propagation::update(double x, double y, double movedMetres, double stepSeconds, double speed) {
    if (movedMetres > 0) {
        const double rho = std::exp(-movedMetres / kShadowingDecorrelationMetres);
        const double innovation = kShadowingSigmaDb * std::sqrt(1.0 - rho * rho);
        const double smoothing = 1.0 - std::exp(-movedMetres / kShadowingSmoothingMetres);
        for (std::size_t site = 0; site < shadowing_.size(); ++site) {
            shadowing_[site] = rho * shadowing_[site] + innovation * normal(random_);
            smoothedShadowing_[site] += smoothing * (shadowing_[site] - smoothedShadowing_[site]);
        }
    }
    movedSinceGeometry_ += movedMetres;
    if (updates_++ % kGeometryEvery == 0 && (updates_ == 1 || movedSinceGeometry_ > 0)) {
        updateGeometry(x, y);
    }
    // The fading is drawn every fifth step and approached linearly in between, as a receiver's filtered
    // measurement would move. Even a device standing still sees some fading from movement around it.
    const bool drawFading = (updates_ - 1) % kFadingEvery == 0;
    const double period = stepSeconds * kFadingEvery;
    const double fadingRho = std::exp(-period * (0.5 + speed));
    const double fadingInnovation = std::sqrt((1.0 - fadingRho * fadingRho) * 0.5);
    const double direct = std::sqrt(kRicianK / (kRicianK + 1.0));
    const double diffuse = std::sqrt(1.0 / (kRicianK + 1.0));
    for (CellState& state : states_) {
        const double slowDb = state.meanDb + smoothedShadowing_[static_cast<std::size_t>(state.site)];
        if (drawFading) {
            if (slowDb >= kInaudibleDb) {
                state.fadingI = fadingRho * state.fadingI + fadingInnovation * normal(random_);
                state.fadingQ = fadingRho * state.fadingQ + fadingInnovation * normal(random_);
                const double i = direct + diffuse * state.fadingI;
                const double q = diffuse * state.fadingQ;
                const double power = std::max(i * i + q * q, 1e-3);
                const double rawDb = std::clamp(10.0 * std::log10(power), -15.0, 6.0);
                const double target = state.fadingDb + kFadingFilter * (rawDb - state.fadingDb);
                state.fadingStepDb = (target - state.fadingDb) / kFadingEvery;
            } else {
                state.fadingStepDb = 0;
            }
        }
        state.fadingDb += state.fadingStepDb;
        state.gainDb = slowDb + state.fadingDb;
    }
}

void Propagation::updateGeometry(double x, double y) {
    movedSinceGeometry_ = 0;
    for (CellState& state : states_) {
        const double dx = x - state.x;
        const double dy = y - state.y;
        const double distance = std::max(std::sqrt(dx * dx + dy * dy), kMinimumDistance);
        const double off = std::remainder(std::atan2(dy, dx) - state.azimuthRadians, 2.0 * kPi);
        const double offDegrees = off * 180.0 / kPi;
        const double pattern = -std::min(
            12.0 * (offDegrees / kBeamwidthDegrees) * (offDegrees / kBeamwidthDegrees), kFrontToBackDb);
        const double distanceLoss = state.frequencyLossDb + 37.6 * std::log10(distance / 1000.0);
        state.meanDb = kAntennaGainDb - kClutterLossDb + pattern - distanceLoss;
    }
}

}  // namespace velmar::sim
