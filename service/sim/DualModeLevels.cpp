#include "service/sim/DualModeLevels.h"

#include <algorithm>
#include <cmath>

namespace velmar::sim {

namespace {

double milliwatts(double dbm) {
    return std::pow(10.0, dbm / 10.0);
}

}  // namespace

void DualModeLevels::update(const RadioSnapshot& snapshot) {
    gsm_.clear();
    umts_.clear();
    for (const HeardCell& heard : snapshot.heard) {
        if (heard.cell < 0 || static_cast<std::size_t>(heard.cell) >= snapshot.cells.size()) {
            continue;
        }
        const SimCell& cell = snapshot.cells[static_cast<std::size_t>(heard.cell)];
        if (cell.rat == CellRat::Gsm) {
            GsmLevel level;
            level.cell = heard.cell;
            level.rssiDbm =
                std::clamp(static_cast<int>(std::lround(kGsmBcchPowerDbm + heard.pathGainDb)), -110, -47);
            level.rxLevel = level.rssiDbm + 110;
            level.c1 = gsmC1(level.rxLevel);
            gsm_.push_back(level);
        } else if (cell.rat == CellRat::Umts) {
            UmtsLevel level;
            level.cell = heard.cell;
            level.rscpDbm = std::clamp(kUmtsCpichPowerDbm + heard.pathGainDb, -120.0, -25.0);
            umts_.push_back(level);
        }
    }
    // The carrier RSSI sums every heard cell of the same UARFCN (a handful of cells, so pairwise is cheap);
    // each cell's carrier power is converted to milliwatts once.
    carrierMilliwatts_.clear();
    for (const UmtsLevel& level : umts_) {
        carrierMilliwatts_.push_back(milliwatts(level.rscpDbm + (kUmtsCarrierPowerDbm - kUmtsCpichPowerDbm)));
    }
    for (UmtsLevel& level : umts_) {
        const std::uint32_t channel = snapshot.cells[static_cast<std::size_t>(level.cell)].channel;
        double total = milliwatts(kUmtsNoiseFloorDbm);
        for (std::size_t i = 0; i < umts_.size(); ++i) {
            if (snapshot.cells[static_cast<std::size_t>(umts_[i].cell)].channel == channel) {
                total += carrierMilliwatts_[i];
            }
        }
        level.carrierRssiDbm = 10.0 * std::log10(total);
        level.ecioDb = std::clamp(level.rscpDbm - level.carrierRssiDbm, -24.0, 0.0);
    }
    const auto byGsmLevel = [](const GsmLevel& a, const GsmLevel& b) { return a.rssiDbm > b.rssiDbm; };
    const auto byRscp = [](const UmtsLevel& a, const UmtsLevel& b) { return a.rscpDbm > b.rscpDbm; };
    std::stable_sort(gsm_.begin(), gsm_.end(), byGsmLevel);
    std::stable_sort(umts_.begin(), umts_.end(), byRscp);
}

const GsmLevel* DualModeLevels::gsmLevel(int cell) const {
    for (const GsmLevel& level : gsm_) {
        if (level.cell == cell) {
            return &level;
        }
    }
    return nullptr;
}

const UmtsLevel* DualModeLevels::umtsLevel(int cell) const {
    for (const UmtsLevel& level : umts_) {
        if (level.cell == cell) {
            return &level;
        }
    }
    return nullptr;
}

}  // namespace velmar::sim
