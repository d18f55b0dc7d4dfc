// UtranEmitter: the records of a UTRAN baseband of the log-code family ("utran"), made from the radio world's
// snapshots of a UMTS-only world (GSM cells, should the world hold any, are reported as GSM neighbours).
//
// Contract (rates in simulated time, from the first snapshot on):
// - the RRC state 0xD0E0 whenever it changes and every 10 s;
// - the serving cell 0xD0E2 on camping, on every change of serving cell and every 5 s;
// - every 1.28 s the UTRAN neighbour measurements 0xD00A (every heard UMTS cell, the serving and
//   soft-handover cells in the active set), the GSM neighbour measurements 0xD00E and the cell-monitor array
//   0xFF0001 (serving and neighbour cells with the same identities);
// - every second while an RRC connection is up (CELL_FACH or CELL_DCH), the transport-channel BLER and the
//   CCTrCH SIR 0xD00C;
// - the SIM files 0xFF0000 at start and every 10 s; the PDP contexts 0xFF0002 every 5 s during a data session
//   and whenever a session starts or ends.
// Levels come from DualModeLevels; block errors and SIR jitter from the generator given.
#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <vector>

#include "service/sim/DualModeLevels.h"
#include "service/sim/EmitterSchedule.h"
#include "service/sim/TechnologyEmitter.h"

namespace velmar::sim {

inline constexpr Tick kUtranMeasurementPeriod = ticksFromMilliseconds(1280);
inline constexpr Tick kUtranChannelQualityPeriod = ticksFromMilliseconds(1000);

// The RRC modes of record 0xD0E0.
enum class UtranRrcMode : std::uint8_t { Disconnected = 0, Connecting, CellFach, CellDch, CellPch, UraPch };

// The RRC mode of a UTRAN handset in the given activity.
UtranRrcMode utranRrcMode(const RadioSnapshot& snapshot);

class UtranEmitter final : public TechnologyEmitter {
  public:
    explicit UtranEmitter(SimRandom& random);
    void step(const RadioSnapshot& snapshot, const BlobOutput& emit) override;

  private:
    enum Timer : std::size_t {
        kMeasurements,
        kChannelQuality,
        kServing,
        kRefresh,
        kSimFiles,
        kPdpContexts,
        kTimerCount
    };

    void fire(Timer timer, Tick tick, const RadioSnapshot& snapshot, const BlobOutput& emit);
    void emitRrcState(UtranRrcMode mode, std::uint64_t timestamp, const BlobOutput& emit);
    void emitServingCell(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitMeasurements(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitCellMonitor(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitChannelQuality(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitPdpContexts(bool sessionUp, std::uint64_t timestamp, const BlobOutput& emit);

    SimRandom& random_;
    BasebandClock clock_;
    // The levels of the current step, computed on first use: most steps emit nothing that needs them.
    const DualModeLevels& levels(const RadioSnapshot& snapshot);
    DualModeLevels levels_;
    std::vector<std::uint8_t> simRecord_;
    bool levelsFresh_ = false;
    std::array<TickTimer, kTimerCount> timers_;
    int lastServing_ = -1;
    bool rrcSent_ = false;
    UtranRrcMode lastRrc_ = UtranRrcMode::Disconnected;
    bool lastDataSession_ = false;
};

std::unique_ptr<TechnologyEmitter> makeUtranEmitter(SimRandom& random);

}  // namespace velmar::sim
