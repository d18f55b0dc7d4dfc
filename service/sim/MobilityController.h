// MobilityController: which cell the device is served by. In idle mode it reselects with hysteresis and a
// reselection timer, in connected mode it hands over on an A3-style event (a neighbour better than the
// serving cell by an offset for a time to trigger). A world with two layers (GSM and UMTS) prefers UMTS
// where its level is good enough and falls back to GSM elsewhere, again with hysteresis and a timer.
//
// Contract: camp() picks the best cell of the preferred usable layer. evaluate() is called once per step
// with the path gains of all cells; it changes the serving cell only when a candidate has beaten it by the
// margin for the whole timer, so levels that hover around each other do not make it ping-pong. A serving
// cell lost altogether (below the hearing threshold) is replaced at once.
#pragma once

#include <cstdint>
#include <vector>

#include "service/sim/RadioSnapshot.h"

namespace velmar::sim {

class MobilityController {
  public:
    static constexpr double kIdleHysteresisDb = 4.0;    // Qhyst
    static constexpr double kReselectionSeconds = 2.0;  // Treselection
    static constexpr double kHandoverOffsetDb = 3.0;    // A3 offset
    static constexpr double kTimeToTriggerSeconds = 0.64;
    static constexpr double kLostDb = -140.0;
    // Dual layer: UMTS counts as usable above this gain, and is left below it less the hysteresis.
    static constexpr double kUpperLayerUsableDb = -124.0;

    explicit MobilityController(const std::vector<SimCell>& cells);

    // The serving cell, -1 before the first camp.
    int serving() const { return serving_; }
    void camp(const std::vector<double>& gains);
    // Answers true when the serving cell changed at this step.
    bool evaluate(const std::vector<double>& gains, bool connected, double stepSeconds);

  private:
    int bestOf(const std::vector<double>& gains, CellRat rat, int except) const;
    bool hasLayer(CellRat rat) const;

    const std::vector<SimCell>& cells_;
    CellRat upper_;
    CellRat lower_;
    int serving_ = -1;
    int candidate_ = -1;
    double candidateSeconds_ = 0;
};

}  // namespace velmar::sim
