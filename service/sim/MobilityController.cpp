#include "service/sim/MobilityController.h"

namespace velmar::sim {

MobilityController::MobilityController(const std::vector<SimCell>& cells) : cells_(cells) {
    upper_ = cells.empty() ? CellRat::Lte : cells.front().rat;
    lower_ = upper_;
    // A dual-layer world lists its GSM cells first; UMTS is the preferred layer above them.
    if (hasLayer(CellRat::Gsm) && hasLayer(CellRat::Umts)) {
        upper_ = CellRat::Umts;
        lower_ = CellRat::Gsm;
    }
}

bool MobilityController::hasLayer(CellRat rat) const {
    for (const SimCell& cell : cells_) {
        if (cell.rat == rat) {
            return true;
        }
    }
    return false;
}

int MobilityController::bestOf(const std::vector<double>& gains, CellRat rat, int except) const {
    int best = -1;
    for (const SimCell& cell : cells_) {
        if (cell.rat != rat || cell.index == except) {
            continue;
        }
        if (best < 0 || gains[static_cast<std::size_t>(cell.index)] > gains[static_cast<std::size_t>(best)]) {
            best = cell.index;
        }
    }
    return best;
}

void MobilityController::camp(const std::vector<double>& gains) {
    const int upper = bestOf(gains, upper_, -1);
    if (upper_ != lower_ && (upper < 0 || gains[static_cast<std::size_t>(upper)] < kUpperLayerUsableDb)) {
        serving_ = bestOf(gains, lower_, -1);
    } else {
        serving_ = upper;
    }
    candidate_ = -1;
    candidateSeconds_ = 0;
}

bool MobilityController::evaluate(const std::vector<double>& gains, bool connected, double stepSeconds) {
    if (serving_ < 0) {
        return false;
    }
    const auto gainOf = [&gains](int cell) { return gains[static_cast<std::size_t>(cell)]; };
    const CellRat servingRat = cells_[static_cast<std::size_t>(serving_)].rat;
    const double servingGain = gainOf(serving_);

    int best = bestOf(gains, servingRat, serving_);
    bool better =
        best >= 0 && gainOf(best) > servingGain + (connected ? kHandoverOffsetDb : kIdleHysteresisDb);
    if (upper_ != lower_) {
        // Between layers: up to UMTS where it is usable, down to GSM where UMTS fades.
        if (servingRat == lower_) {
            const int upper = bestOf(gains, upper_, -1);
            if (upper >= 0 && gainOf(upper) >= kUpperLayerUsableDb) {
                best = upper;
                better = true;
            }
        } else if (servingGain < kUpperLayerUsableDb - kIdleHysteresisDb) {
            const int lower = bestOf(gains, lower_, -1);
            if (lower >= 0) {
                best = lower;
                better = true;
            }
        }
    }

    if (servingGain < kLostDb && best >= 0 && gainOf(best) > servingGain) {
        serving_ = best;
        candidate_ = -1;
        candidateSeconds_ = 0;
        return true;
    }
    if (!better) {
        candidate_ = -1;
        candidateSeconds_ = 0;
        return false;
    }
    if (best != candidate_) {
        candidate_ = best;
        candidateSeconds_ = 0;
    }
    candidateSeconds_ += stepSeconds;
    if (candidateSeconds_ + 1e-9 < (connected ? kTimeToTriggerSeconds : kReselectionSeconds)) {
        return false;
    }
    serving_ = candidate_;
    candidate_ = -1;
    candidateSeconds_ = 0;
    return true;
}

}  // namespace velmar::sim
