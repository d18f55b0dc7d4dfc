// LteEmitter: the LTE baseband's log records from the radio world's snapshots.
//
// Rates, as an LTE baseband logs them: in idle mode the serving-cell measurement (0xB17F) and the neighbour
// measurements (0xB180) once per DRX cycle of 1.28 s and the reselection candidates (0xB186) every fourth
// cycle; while RRC is connected (attach, connections) the intra-frequency measurements (0xB179) every 200 ms;
// the serving-cell information (0xB0C2, 0xB0C1) on every change of serving cell and every 10.24 s. The
// telephony service's extra records: the cell-monitor array (0xFF0001) every 2 s, the SIM files (0xFF0000)
// at registration and every 30 s, the packet-data contexts (0xFF0002) on every change and every 10 s (the
// default bearer from the end of registration; a second context while a data connection is up).
//
// Contract: levels are the snapshot's path gains plus the cell's reference-signal power; RSSI sums every
// heard cell's power over the 20 MHz carrier at its load plus thermal noise, and RSRQ follows from both.
// Every value is clamped into its record field.
#pragma once

#include <cstdint>
#include <vector>

#include "core/platform/plist/PlistValue.h"
#include "service/sim/PeriodicTimer.h"
#include "service/sim/TechnologyEmitter.h"

namespace velmar::sim {

class LteEmitter : public TechnologyEmitter {
  public:
    explicit LteEmitter(SimRandom& random);

    void step(const RadioSnapshot& snapshot, const BlobOutput& emit) override;

  private:
    struct CellLevels {
        double rsrp = -140;  // dBm
        double rsrq = -20;   // dB
        double averageRsrp = -140;
        double averageRsrq = -20;
        bool averaged = false;
    };
    struct CellTraits {
        double load = 0.5;
        std::uint16_t frequencyOffset = 0;
        std::uint16_t frameOffset = 0;
        std::uint32_t sampleOffset = 0;
    };

    void measure(const RadioSnapshot& snapshot);
    void send(const PlistData& blob, const BlobOutput& emit);
    void emitServingCellInfo(const RadioSnapshot& snapshot, const BlobOutput& emit);
    void emitIntraFrequency(const RadioSnapshot& snapshot, const BlobOutput& emit);
    void emitIdleServing(const RadioSnapshot& snapshot, const BlobOutput& emit);
    void emitIdleNeighbours(const RadioSnapshot& snapshot, const BlobOutput& emit);
    void emitReselectionCandidates(const RadioSnapshot& snapshot, const BlobOutput& emit);
    void emitCellMonitor(const RadioSnapshot& snapshot, const BlobOutput& emit);
    void emitPdpContexts(const RadioSnapshot& snapshot, const BlobOutput& emit);

    SimRandom& random_;
    std::vector<CellLevels> levels_;
    std::vector<CellTraits> traits_;
    double rssiDbm_ = -100;
    bool measured_ = false;  // levels are up to date for this step
    int lastServing_ = -1;
    int contextsShown_ = -1;  // number of packet-data contexts last reported
    bool simSent_ = false;
    bool wasConnected_ = false;
    PeriodicTimer servingInfo_{10.24};
    PeriodicTimer intraFrequency_{0.2};
    PeriodicTimer idleServing_{1.28};
    PeriodicTimer idleNeighbours_{1.28, 0.04};
    PeriodicTimer reselection_{5.12, 0.08};
    PeriodicTimer cellMonitor_{2.0};
    PeriodicTimer simFiles_{30.0};
    PeriodicTimer pdpContexts_{10.0};
};

}  // namespace velmar::sim
