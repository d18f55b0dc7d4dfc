// DualModeLevels: what a GSM/UMTS handset measures from the cells it hears. The radio world gives path gains;
// this applies the transmit powers of the two layers and the receiver's noise, and yields the figures that
// the GSM and UMTS records carry, each clamped to what a handset reports (GSM RSSI -110..-47 dBm, RSCP
// -120..-25 dBm, Ec/Io -24..0 dB).
//
// Contract: update() rebuilds both lists from one snapshot, strongest first, reusing their storage. The GSM
// list holds the heard GSM cells, the UMTS list the heard UMTS cells; the carrier RSSI of a UMTS cell is the
// total power received on its UARFCN from every heard UMTS cell of that channel plus thermal noise, so its
// Ec/Io falls when cells of the same channel overlap, as on a real soft-handover border.
#pragma once

#include <vector>

#include "service/sim/RadioSnapshot.h"

namespace velmar::sim {

inline constexpr double kGsmBcchPowerDbm = 43.0;      // 20 W on the BCCH carrier
inline constexpr double kUmtsCpichPowerDbm = 33.0;    // pilot at 10 % of a 20 W carrier
inline constexpr double kUmtsCarrierPowerDbm = 40.0;  // the carrier at half load
inline constexpr double kUmtsNoiseFloorDbm = -100.0;  // 3.84 MHz at 7 dB noise figure

struct GsmLevel {
    int cell = 0;     // index into RadioSnapshot::cells
    int rssiDbm = 0;  // -110..-47
    int rxLevel = 0;  // 0..63, RSSI + 110
    int c1 = 0;       // path-loss criterion, never below zero
};

struct UmtsLevel {
    int cell = 0;
    double rscpDbm = 0;         // -120..-25
    double ecioDb = 0;          // -24..0
    double carrierRssiDbm = 0;  // total power on the cell's UARFCN
};

class DualModeLevels {
  public:
    void update(const RadioSnapshot& snapshot);

    const std::vector<GsmLevel>& gsm() const { return gsm_; }
    const std::vector<UmtsLevel>& umts() const { return umts_; }
    // The entry of a cell, or null when the cell is not heard on that layer.
    const GsmLevel* gsmLevel(int cell) const;
    const UmtsLevel* umtsLevel(int cell) const;

  private:
    std::vector<GsmLevel> gsm_;
    std::vector<UmtsLevel> umts_;
    std::vector<double> carrierMilliwatts_;  // scratch, index for index with umts_
};

// The C1 path-loss criterion of a GSM cell heard at rxLevel (RXLEV_ACCESS_MIN 6, no power penalty).
inline int gsmC1(int rxLevel) {
    return rxLevel > 6 ? rxLevel - 6 : 0;
}

}  // namespace velmar::sim
