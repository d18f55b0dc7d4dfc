// GsmEmitter: the records of a dual-mode GSM/UMTS baseband of the log-code family ("gsm"), made from the
// radio world's snapshots. The world mixes GSM and UMTS cells; the serving cell's RAT decides which stack
// reports measurements, while the mobility-management and registration layers report on both.
//
// Contract (rates in simulated time, from the first snapshot on):
// - on a GSM cell: the measurement report 0x5137 every 480 ms, preceded by the BSIC list 0x51FF on every
//   fifth report and after each change of serving cell; the cell identity 0x5134, channel parameters 0x5072,
//   the GPRS mobile allocation 0x51F8 and the GPRS cell records (0x51F4, 0x51F5, 0x51F6, 0x51FB, 0x51FD) on
//   camping and every 10 s; the dedicated channel 0x5076 and its allocation 0x51F8 on each channel
//   assignment or handover;
// - on a UMTS cell: every 1.28 s the idle measurements 0x4005 (the UMTS cells, then the GSM cells); the
//   cell identity 0x4127 on camping and every 5 s; in CELL_DCH the cell sets 0x417A every 200 ms and each
//   second the uplink power 0x4031, the transport-channel BLER 0x4116 and, with a data session, HSDPA 0x4221;
//   ciphering 0x4157 on each connection;
// - on both: registration, MM, GMM, GSM RR and UMTS RRC states (0x7132, 0x7131, 0x7130, 0x512C, 0x4125)
//   whenever they change and every 10 s; registration information 0x7135 and equivalent PLMNs 0x7150 after
//   each registration or area update and every 10 s; the cell-monitor array 0xFF0001 every 1.28 s; the SIM
//   files 0xFF0000 at start and every 10 s; the PDP contexts 0xFF0002 every 5 s during a data session and
//   whenever a session starts or ends.
// Every figure comes from the snapshot through DualModeLevels, so the binary records and the cell-monitor
// array agree; randomness (block errors, transmit-power jitter) comes only from the generator given.
#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <vector>

#include "service/sim/DualModeLevels.h"
#include "service/sim/EmitterSchedule.h"
#include "service/sim/TechnologyEmitter.h"

namespace velmar::sim {

inline constexpr Tick kGsmMeasurementPeriod = ticksFromMilliseconds(480);
inline constexpr Tick kUmtsIdleMeasurementPeriod = ticksFromMilliseconds(1280);
inline constexpr Tick kUmtsConnectedMeasurementPeriod = ticksFromMilliseconds(200);

class GsmEmitter final : public TechnologyEmitter {
  public:
    explicit GsmEmitter(SimRandom& random);
    void step(const RadioSnapshot& snapshot, const BlobOutput& emit) override;

    // The layer states as the records carry them; public so that tests can name what they expect.
    struct LayerStates {
        std::uint8_t registration = 0;  // 0x7132 byte 13
        std::array<std::uint8_t, 3> mm{};
        std::array<std::uint8_t, 3> gmm{};
        std::array<std::uint8_t, 4> rr{};
        std::uint8_t rrc = 0;
        bool operator==(const LayerStates&) const = default;
    };

  private:
    enum Timer : std::size_t {
        kGsmReport,
        kUmtsCycle,
        kCellSets,
        kDchStatistics,
        kIdentity,
        kRefresh,
        kSimFiles,
        kPdpContexts,
        kTimerCount
    };

    void fire(Timer timer, Tick tick, const RadioSnapshot& snapshot, const BlobOutput& emit);
    void handleEvents(const RadioSnapshot& snapshot, Tick now, const BlobOutput& emit);
    LayerStates statesFor(const RadioSnapshot& snapshot, Tick now) const;
    void emitStates(const LayerStates& states, std::uint64_t timestamp, const BlobOutput& emit);

    void emitGsmReport(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitBsicList(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitGsmCellRecords(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitGsmDedicated(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitIdentity(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitUmtsIdle(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitCellSets(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitDchStatistics(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitRegistration(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitCellMonitor(const RadioSnapshot& snapshot, std::uint64_t timestamp, const BlobOutput& emit);
    void emitPdpContexts(bool sessionUp, std::uint64_t timestamp, const BlobOutput& emit);

    const SimCell* servingCell(const RadioSnapshot& snapshot) const;
    bool onGsm(const RadioSnapshot& snapshot) const;
    bool onUmts(const RadioSnapshot& snapshot) const;
    bool inCellDch(const RadioSnapshot& snapshot) const;

    SimRandom& random_;
    BasebandClock clock_;
    // The levels of the current step, computed on first use: most steps emit nothing that needs them.
    const DualModeLevels& levels(const RadioSnapshot& snapshot);
    DualModeLevels levels_;
    std::vector<std::uint8_t> simRecord_;
    bool levelsFresh_ = false;
    std::array<TickTimer, kTimerCount> timers_;

    int lastServing_ = -1;
    ActivityPhase lastPhase_ = ActivityPhase::PowerOn;
    bool lastDataSession_ = false;
    bool statesSent_ = false;
    LayerStates lastStates_{};
    std::uint32_t gsmReports_ = 0;
    bool bsicListDue_ = true;
    // A transient RR state (reselection, inter-RAT change) shown until the tick given.
    std::uint8_t rrTransient_ = 0;
    Tick rrTransientUntil_ = 0;
    // A location / routing area update after the serving cell moved to another area.
    std::uint32_t registeredLac_ = 0;
    std::uint32_t registeredRac_ = 0;
    bool registered_ = false;
    bool areaUpdatePending_ = false;
    bool lacChanged_ = false;
    Tick areaUpdateUntil_ = 0;
};

std::unique_ptr<TechnologyEmitter> makeGsmEmitter(SimRandom& random);

}  // namespace velmar::sim
