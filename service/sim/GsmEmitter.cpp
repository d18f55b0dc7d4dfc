#include "service/sim/GsmEmitter.h"

#include <algorithm>
#include <cmath>
#include <string>

#include "core/platform/KxServerProtocol.h"
#include "logfile/records/GsmRecords.h"
#include "logfile/records/GsmStateRecords.h"
#include "service/sim/PdpSession.h"
#include "service/sim/SimCardFiles.h"

namespace velmar::sim {

namespace {

constexpr Tick kIdentityPeriod = ticksFromMilliseconds(5000);
constexpr Tick kRefreshPeriod = ticksFromMilliseconds(10000);
constexpr Tick kSimFilesPeriod = ticksFromMilliseconds(10000);
constexpr Tick kPdpPeriod = ticksFromMilliseconds(5000);
constexpr Tick kDchStatisticsPeriod = ticksFromMilliseconds(1000);
constexpr Tick kRrTransientTicks = ticksFromMilliseconds(500);
constexpr Tick kAreaUpdateTicks = ticksFromMilliseconds(1200);

constexpr std::size_t kMaxGsmNeighbours = 6;
constexpr std::size_t kMaxUmtsCells = 8;
constexpr std::size_t kMaxActiveSet = 3;
constexpr double kSoftHandoverWindowDb = 3.0;
constexpr int kBsicListEveryReports = 5;
constexpr std::uint8_t kReselectHysteresis = 2;  // CELL_RESELECT_HYSTERESIS, 4 dB

// Registration (0x7132), MM (0x7131), GMM (0x7130), GSM RR (0x512C) and UMTS RRC (0x4125) values.
constexpr std::uint8_t kRegIdle = 1, kRegRegistering = 2, kRegAutomaticSearch = 5;
constexpr std::uint8_t kMmLocationUpdateInitiated = 3, kMmConnectionActive = 6, kMmWaitForNetworkCommand = 9,
                       kMmWaitForRrConnectionLu = 13, kMmWaitForRrConnectionMm = 14, kMmIdle = 19;
constexpr std::uint8_t kMmSubPlmnSearch = 2, kMmSubLocationUpdateNeeded = 5, kMmSubNormalService = 8;
constexpr std::uint8_t kLuUpdated = 0, kLuNotUpdated = 1;
constexpr std::uint8_t kGmmDeregistered = 1, kGmmRegisteredInitiated = 2, kGmmRegistered = 3,
                       kGmmRoutingAreaUpdateInitiated = 5, kGmmServiceRequestInitiated = 6;
constexpr std::uint8_t kGmmSubNormalService = 0, kGmmSubAttachNeeded = 2, kGmmSubPlmnSearch = 6;
constexpr std::uint8_t kGmmUpdated = 0, kGmmNotUpdated = 1;
constexpr std::uint8_t kRrInactive = 0, kRrCellSelection = 3, kRrIdle = 5, kRrCellReselection = 6,
                       kRrConnectionPending = 7, kRrDataTransfer = 9, kRrConnectionRelease = 11,
                       kRrW2gHandover = 13, kRrW2gReselection = 14, kRrG2wReselection = 18,
                       kRrG2wHandover = 19;
constexpr std::uint8_t kRrcDisconnected = 0, kRrcConnecting = 1, kRrcCellFach = 2, kRrcCellDch = 3,
                       kRrcCellPch = 4;

bool registeredPhase(ActivityPhase phase) {
    return phase != ActivityPhase::PowerOn && phase != ActivityPhase::Registering;
}

// The GPRS mobile allocation of a GSM cell: four hopping ARFCNs above the BCCH carriers, ascending.
std::array<std::uint16_t, 4> mobileAllocation(const SimCell& cell) {
    std::array<std::uint16_t, 4> arfcns{};
    for (std::size_t k = 0; k < arfcns.size(); ++k) {
        arfcns[k] = static_cast<std::uint16_t>(40 + (cell.channel * 5 + k * 19) % 84);
    }
    std::sort(arfcns.begin(), arfcns.end());
    return arfcns;
}

std::uint8_t hoppingSequenceNumber(const SimCell& cell) {
    return static_cast<std::uint8_t>(cell.cellId % 63 + 1);
}

// Downlink block error ratio of a UMTS link at the given pilot Ec/Io: about 1 % near -15 dB, rising fast
// below.
double blockErrorRatio(double ecioDb) {
    return std::clamp(0.01 * std::pow(10.0, (-15.0 - ecioDb) / 4.0), 0.001, 0.5);
}

// Linear Ec/Io reading of the cell-set record: 524288 stands for 0 dB.
std::uint32_t linearEcio(double ecioDb) {
    return static_cast<std::uint32_t>(std::lround(524288.0 * std::pow(10.0, ecioDb / 10.0)));
}

std::int64_t roundedHalf(int dbm) {
    return std::lround(static_cast<double>(dbm) / 2.0);
}

}  // namespace

std::unique_ptr<TechnologyEmitter> makeGsmEmitter(SimRandom& random) {
    return std::make_unique<GsmEmitter>(random);
}

GsmEmitter::GsmEmitter(SimRandom& random)
    : random_(random),
      timers_{TickTimer(kGsmMeasurementPeriod),
              TickTimer(kUmtsIdleMeasurementPeriod),
              TickTimer(kUmtsConnectedMeasurementPeriod),
              TickTimer(kDchStatisticsPeriod),
              TickTimer(kIdentityPeriod),
              TickTimer(kRefreshPeriod),
              TickTimer(kSimFilesPeriod),
              TickTimer(kPdpPeriod)} {}

void GsmEmitter::step(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    const Tick now = ticksFromSeconds(snapshot.time);
    if (!clock_.started()) {
        clock_.start(snapshot.time, snapshot.basebandTimestamp);
        for (TickTimer& timer : timers_) {
            timer.arm(now);
        }
        timers_[kSimFiles].armAt(now);
    }
    levelsFresh_ = false;
    fireDueTimers(timers_, now,
                  [&](std::size_t due, Tick at) { fire(static_cast<Timer>(due), at, snapshot, emit); });
    handleEvents(snapshot, now, emit);
}

const SimCell* GsmEmitter::servingCell(const RadioSnapshot& snapshot) const {
    if (snapshot.servingCell < 0 || static_cast<std::size_t>(snapshot.servingCell) >= snapshot.cells.size()) {
        return nullptr;
    }
    return &snapshot.cells[static_cast<std::size_t>(snapshot.servingCell)];
}

bool GsmEmitter::onGsm(const RadioSnapshot& snapshot) const {
    const SimCell* cell = servingCell(snapshot);
    return cell != nullptr && cell->rat == CellRat::Gsm;
}

bool GsmEmitter::onUmts(const RadioSnapshot& snapshot) const {
    const SimCell* cell = servingCell(snapshot);
    return cell != nullptr && cell->rat == CellRat::Umts;
}

bool GsmEmitter::inCellDch(const RadioSnapshot& snapshot) const {
    return onUmts(snapshot) && statesFor(snapshot, ticksFromSeconds(snapshot.time)).rrc == kRrcCellDch;
}

const DualModeLevels& GsmEmitter::levels(const RadioSnapshot& snapshot) {
    if (!levelsFresh_) {
        levels_.update(snapshot);
        levelsFresh_ = true;
    }
    return levels_;
}

void GsmEmitter::fire(Timer timer, Tick tick, const RadioSnapshot& snapshot, const BlobOutput& emit) {
    const std::uint64_t timestamp = clock_.timestamp(tick);
    switch (timer) {
        case kGsmReport:
            if (onGsm(snapshot)) {
                emitGsmReport(snapshot, timestamp, emit);
            }
            break;
        case kUmtsCycle:
            if (onUmts(snapshot)) {
                emitUmtsIdle(snapshot, timestamp, emit);
            }
            if (servingCell(snapshot) != nullptr) {
                emitCellMonitor(snapshot, timestamp, emit);
            }
            break;
        case kCellSets:
            if (inCellDch(snapshot)) {
                emitCellSets(snapshot, timestamp, emit);
            }
            break;
        case kDchStatistics:
            if (inCellDch(snapshot)) {
                emitDchStatistics(snapshot, timestamp, emit);
            }
            break;
        case kIdentity:
            emitIdentity(snapshot, timestamp, emit);
            break;
        case kRefresh:
            lastStates_ = statesFor(snapshot, tick);
            statesSent_ = true;
            emitStates(lastStates_, timestamp, emit);
            if (registered_) {
                emitRegistration(snapshot, timestamp, emit);
            }
            if (onGsm(snapshot)) {
                emitGsmCellRecords(snapshot, timestamp, emit);
            }
            if (onUmts(snapshot) && snapshot.phase == ActivityPhase::Connected) {
                emit(buildCipheringRecord(CipheringRecord{1, 0}, timestamp));
            }
            break;
        case kSimFiles:
            // The SIM's files do not change: built once, restamped afterwards.
            if (simRecord_.empty()) {
                simRecord_ = buildSimCardRecord(timestamp);
            }
            restampPacket(simRecord_, timestamp);
            emit(simRecord_);
            break;
        case kPdpContexts:
            if (snapshot.dataSession) {
                emitPdpContexts(true, timestamp, emit);
            }
            break;
        case kTimerCount:
            break;
    }
}

void GsmEmitter::handleEvents(const RadioSnapshot& snapshot, Tick now, const BlobOutput& emit) {
    const std::uint64_t timestamp = clock_.timestamp(now);
    const SimCell* serving = servingCell(snapshot);
    const bool connected = snapshot.phase == ActivityPhase::Connected;

    if (snapshot.servingCell != lastServing_) {
        const int previous = lastServing_;
        lastServing_ = snapshot.servingCell;
        if (serving != nullptr) {
            if (previous >= 0 && static_cast<std::size_t>(previous) < snapshot.cells.size()) {
                const CellRat from = snapshot.cells[static_cast<std::size_t>(previous)].rat;
                rrTransient_ = 0;
                if (from == CellRat::Gsm && serving->rat == CellRat::Gsm && !connected) {
                    rrTransient_ = kRrCellReselection;
                } else if (from == CellRat::Gsm && serving->rat == CellRat::Umts) {
                    rrTransient_ = connected ? kRrG2wHandover : kRrG2wReselection;
                } else if (from == CellRat::Umts && serving->rat == CellRat::Gsm) {
                    rrTransient_ = connected ? kRrW2gHandover : kRrW2gReselection;
                }
                rrTransientUntil_ = now + kRrTransientTicks;
            }
            emitIdentity(snapshot, timestamp, emit);
            if (serving->rat == CellRat::Gsm) {
                bsicListDue_ = true;
                emitGsmCellRecords(snapshot, timestamp, emit);
                if (connected) {
                    emitGsmDedicated(snapshot, timestamp, emit);
                }
            } else if (serving->rat == CellRat::Umts && connected) {
                emit(buildCipheringRecord(CipheringRecord{1, 0}, timestamp));
            }
            if (registered_ &&
                (serving->areaCode != registeredLac_ || serving->routingArea != registeredRac_)) {
                lacChanged_ = serving->areaCode != registeredLac_;
                registeredLac_ = serving->areaCode;
                registeredRac_ = serving->routingArea;
                areaUpdatePending_ = true;
                areaUpdateUntil_ = now + kAreaUpdateTicks;
            }
        }
    }

    if (snapshot.phase != lastPhase_) {
        if (!registeredPhase(lastPhase_) && registeredPhase(snapshot.phase) && serving != nullptr) {
            registered_ = true;
            registeredLac_ = serving->areaCode;
            registeredRac_ = serving->routingArea;
            emitRegistration(snapshot, timestamp, emit);
        }
        if (connected && serving != nullptr) {
            if (serving->rat == CellRat::Gsm) {
                emitGsmDedicated(snapshot, timestamp, emit);
            } else {
                emit(buildCipheringRecord(CipheringRecord{1, 0}, timestamp));
            }
        }
        lastPhase_ = snapshot.phase;
    }

    if (areaUpdatePending_ && now >= areaUpdateUntil_) {
        areaUpdatePending_ = false;
        emitRegistration(snapshot, timestamp, emit);
    }

    const LayerStates states = statesFor(snapshot, now);
    if (!statesSent_) {
        emitStates(states, timestamp, emit);
    } else if (states != lastStates_) {
        // Only the layers that changed report.
        if (states.registration != lastStates_.registration) {
            emit(buildRegistrationStateRecord(RegistrationStateRecord{states.registration, 0, 0}, timestamp));
        }
        if (states.mm != lastStates_.mm) {
            emit(buildMmStateRecord(MmStateRecord{states.mm[0], states.mm[1], states.mm[2], 0}, timestamp));
        }
        if (states.gmm != lastStates_.gmm) {
            emit(buildGmmStateRecord(GmmStateRecord{states.gmm[0], states.gmm[1], states.gmm[2], 0},
                                     timestamp));
        }
        if (states.rr != lastStates_.rr) {
            emit(buildGsmRrStateRecord(
                GsmRrStateRecord{states.rr[0], states.rr[1], states.rr[2], states.rr[3], 0}, timestamp));
        }
        if (states.rrc != lastStates_.rrc) {
            emit(buildRrcStateRecord(RrcStateRecord{states.rrc, 0}, timestamp));
        }
    }
    statesSent_ = true;
    lastStates_ = states;

    if (snapshot.dataSession != lastDataSession_) {
        lastDataSession_ = snapshot.dataSession;
        emitPdpContexts(snapshot.dataSession, timestamp, emit);
    }
}

GsmEmitter::LayerStates GsmEmitter::statesFor(const RadioSnapshot& snapshot, Tick now) const {
    LayerStates states;
    const ActivityPhase phase = snapshot.phase;
    const bool data = snapshot.dataSession;
    const bool early = snapshot.phaseTime < 0.5;
    const bool updating = areaUpdatePending_ && now < areaUpdateUntil_;
    const bool gsm = onGsm(snapshot);
    const bool umts = onUmts(snapshot);

    switch (phase) {
        case ActivityPhase::PowerOn:
            states.registration = kRegAutomaticSearch;
            states.mm = {kMmIdle, kMmSubPlmnSearch, kLuNotUpdated};
            states.gmm = {kGmmDeregistered, kGmmSubPlmnSearch, kGmmNotUpdated};
            break;
        case ActivityPhase::Registering:
            states.registration = kRegRegistering;
            states.mm = {early ? kMmWaitForRrConnectionLu : kMmLocationUpdateInitiated,
                         kMmSubLocationUpdateNeeded, kLuNotUpdated};
            states.gmm = {kGmmRegisteredInitiated, kGmmSubAttachNeeded, kGmmNotUpdated};
            break;
        case ActivityPhase::Idle:
        case ActivityPhase::Connecting:
        case ActivityPhase::Connected:
        case ActivityPhase::Releasing: {
            states.registration = updating ? kRegRegistering : kRegIdle;
            std::uint8_t mm = kMmIdle;
            if (!data && phase == ActivityPhase::Connecting) {
                mm = kMmWaitForRrConnectionMm;
            } else if (!data && phase == ActivityPhase::Connected) {
                mm = kMmConnectionActive;
            } else if (!data && phase == ActivityPhase::Releasing) {
                mm = kMmWaitForNetworkCommand;
            } else if (updating && lacChanged_ && phase == ActivityPhase::Idle) {
                mm = kMmLocationUpdateInitiated;
            }
            states.mm = {mm, kMmSubNormalService, kLuUpdated};
            std::uint8_t gmm = kGmmRegistered;
            if (updating) {
                gmm = kGmmRoutingAreaUpdateInitiated;
            } else if (data && umts && phase == ActivityPhase::Connecting) {
                gmm = kGmmServiceRequestInitiated;
            }
            states.gmm = {gmm, kGmmSubNormalService, kGmmUpdated};
            break;
        }
    }

    std::uint8_t rr = kRrInactive;
    if (now < rrTransientUntil_ && rrTransient_ != 0) {
        rr = rrTransient_;
    } else if (gsm || (servingCell(snapshot) == nullptr && phase == ActivityPhase::PowerOn)) {
        switch (phase) {
            case ActivityPhase::PowerOn:
                rr = kRrCellSelection;
                break;
            case ActivityPhase::Registering:
                rr = early ? kRrConnectionPending : kRrDataTransfer;
                break;
            case ActivityPhase::Idle:
                rr = kRrIdle;
                break;
            case ActivityPhase::Connecting:
                rr = kRrConnectionPending;
                break;
            case ActivityPhase::Connected:
                rr = kRrDataTransfer;
                break;
            case ActivityPhase::Releasing:
                rr = kRrConnectionRelease;
                break;
        }
    }
    states.rr = {rr, 0, 0, static_cast<std::uint8_t>(data ? 1 : 0)};

    std::uint8_t rrc = kRrcDisconnected;
    if (umts) {
        switch (phase) {
            case ActivityPhase::PowerOn:
                rrc = kRrcDisconnected;
                break;
            case ActivityPhase::Registering:
                rrc = early ? kRrcConnecting : kRrcCellDch;
                break;
            case ActivityPhase::Idle:
                rrc = data ? kRrcCellPch : kRrcDisconnected;
                break;
            case ActivityPhase::Connecting:
                rrc = kRrcConnecting;
                break;
            case ActivityPhase::Connected:
                rrc = kRrcCellDch;
                break;
            case ActivityPhase::Releasing:
                rrc = kRrcCellFach;
                break;
        }
    }
    states.rrc = rrc;
    return states;
}

void GsmEmitter::emitStates(const LayerStates& states, std::uint64_t timestamp, const BlobOutput& emit) {
    emit(buildRegistrationStateRecord(RegistrationStateRecord{states.registration, 0, 0}, timestamp));
    emit(buildMmStateRecord(MmStateRecord{states.mm[0], states.mm[1], states.mm[2], 0}, timestamp));
    emit(buildGmmStateRecord(GmmStateRecord{states.gmm[0], states.gmm[1], states.gmm[2], 0}, timestamp));
    emit(buildGsmRrStateRecord(GsmRrStateRecord{states.rr[0], states.rr[1], states.rr[2], states.rr[3], 0},
                               timestamp));
    emit(buildRrcStateRecord(RrcStateRecord{states.rrc, 0}, timestamp));
}

void GsmEmitter::emitGsmReport(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                               const BlobOutput& emit) {
    const GsmLevel* serving = levels(snapshot).gsmLevel(snapshot.servingCell);
    if (serving == nullptr) {
        return;
    }
    if (bsicListDue_ || gsmReports_ % kBsicListEveryReports == 0) {
        emitBsicList(snapshot, timestamp, emit);
        bsicListDue_ = false;
    }
    ++gsmReports_;
    const SimCell& cell = snapshot.cells[static_cast<std::size_t>(serving->cell)];
    GsmMeasurementRecord record;
    record.rxLevel = static_cast<std::uint8_t>(-serving->rssiDbm);
    record.c1 = static_cast<std::uint32_t>(serving->c1);
    record.c2 = static_cast<std::uint32_t>(serving->c1 + 2 * (cell.index % 3));  // CELL_RESELECT_OFFSET
    record.reselectHysteresis = kReselectHysteresis;
    record.neighbours.reserve(kMaxGsmNeighbours);
    for (const GsmLevel& level : levels(snapshot).gsm()) {
        if (level.cell == serving->cell) {
            continue;
        }
        if (record.neighbours.size() == kMaxGsmNeighbours) {
            break;
        }
        const SimCell& neighbour = snapshot.cells[static_cast<std::size_t>(level.cell)];
        record.neighbours.push_back(GsmNeighbourMeasurement{static_cast<std::uint16_t>(neighbour.channel),
                                                            static_cast<std::uint8_t>(-level.rssiDbm),
                                                            level.c1});
    }
    emit(buildGsmMeasurementRecord(record, timestamp));
}

void GsmEmitter::emitBsicList(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                              const BlobOutput& emit) {
    GsmBsicListRecord record;
    record.entries.reserve(kMaxGsmNeighbours + 1);
    for (const GsmLevel& level : levels(snapshot).gsm()) {
        if (record.entries.size() == kMaxGsmNeighbours + 1) {
            break;
        }
        const SimCell& cell = snapshot.cells[static_cast<std::size_t>(level.cell)];
        record.entries.push_back(GsmBsicEntry{static_cast<std::uint16_t>(cell.channel),
                                              static_cast<std::uint8_t>(cell.physicalId & 0x3F)});
    }
    emit(buildGsmBsicListRecord(record, timestamp));
}

void GsmEmitter::emitGsmCellRecords(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                                    const BlobOutput& emit) {
    const SimCell* cell = servingCell(snapshot);
    if (cell == nullptr) {
        return;
    }
    const std::uint8_t dtx = snapshot.phase == ActivityPhase::Connected && !snapshot.dataSession ? 1 : 0;
    emit(buildGsmChannelParametersRecord(GsmChannelParametersRecord{dtx, 0}, timestamp));
    const std::array<std::uint16_t, 4> allocation = mobileAllocation(*cell);
    MobileAllocationRecord ma;
    ma.hsn = hoppingSequenceNumber(*cell);
    ma.arfcns.assign(allocation.begin(), allocation.end());
    emit(buildMobileAllocationRecord(ma, timestamp));
    emit(buildSi13PositionRecord(Si13PositionRecord{0, 0}, timestamp));  // SI13 on the BCCH
    // No packet flow contexts, access for priorities 1 to 4, NC0.
    emit(buildGprsCellOptionsRecord(GprsCellOptionsRecord{0, 6, 0, 0}, timestamp));
    // T3192 500 ms, DRX timer maximum 2 s, 8-bit access bursts.
    emit(buildGprsTbfParametersRecord(GprsTbfParametersRecord{0, 2, 0, 0}, timestamp));
    emit(buildPbcchRecord(PbcchRecord{0, 0}, timestamp));
    emit(buildPacketSystemInfoRecord(PacketSystemInfoRecord{0, 0, 0, 0, 1, 0}, timestamp));
}

void GsmEmitter::emitGsmDedicated(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                                  const BlobOutput& emit) {
    const SimCell* cell = servingCell(snapshot);
    if (cell == nullptr) {
        return;
    }
    const std::array<std::uint16_t, 4> allocation = mobileAllocation(*cell);
    emit(buildGsmDedicatedChannelRecord(GsmDedicatedChannelRecord{allocation[0], 0}, timestamp));
    MobileAllocationRecord ma;
    ma.hsn = hoppingSequenceNumber(*cell);
    ma.arfcns.assign(allocation.begin(), allocation.end());
    emit(buildMobileAllocationRecord(ma, timestamp));
    const std::uint8_t dtx = snapshot.dataSession ? 0 : 1;
    emit(buildGsmChannelParametersRecord(GsmChannelParametersRecord{dtx, 0}, timestamp));
}

void GsmEmitter::emitIdentity(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                              const BlobOutput& emit) {
    const SimCell* cell = servingCell(snapshot);
    if (cell == nullptr) {
        return;
    }
    if (cell->rat == CellRat::Gsm) {
        emit(buildGsmServingIdentityRecord(
            GsmServingIdentityRecord{static_cast<std::uint16_t>(cell->channel),
                                     static_cast<std::uint16_t>(cell->physicalId),
                                     static_cast<std::uint16_t>(cell->cellId & 0xFFFF), 0},
            timestamp));
    } else if (cell->rat == CellRat::Umts) {
        UmtsCellIdentityRecord record;
        record.downlinkFrequency = cell->channel;
        record.uplinkFrequency = cell->channel > 950 ? cell->channel - 950 : cell->channel;  // band I duplex
        record.cellId = cell->cellId;
        record.uraId = static_cast<std::uint16_t>(cell->routingArea);
        emit(buildUmtsCellIdentityRecord(record, timestamp));
    }
}

void GsmEmitter::emitUmtsIdle(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                              const BlobOutput& emit) {
    UmtsSetRecord umts;
    umts.cells.reserve(kMaxUmtsCells);
    for (const UmtsLevel& level : levels(snapshot).umts()) {
        if (umts.cells.size() == kMaxUmtsCells) {
            break;
        }
        const SimCell& cell = snapshot.cells[static_cast<std::size_t>(level.cell)];
        const int rscp = static_cast<int>(std::lround(level.rscpDbm));
        UmtsSetCell entry;
        entry.downlinkFrequency = static_cast<std::int16_t>(cell.channel);
        entry.scramblingCode = static_cast<std::uint16_t>(cell.physicalId);
        entry.rscpRaw = static_cast<std::int8_t>(rscp + 21);
        entry.rankCellRscp = static_cast<std::int16_t>(rscp);
        entry.ecioHalfDb = static_cast<std::int8_t>(std::lround(level.ecioDb * 2.0));
        // R criterion: the serving cell's rank carries the hysteresis Qhyst (4 dB).
        entry.rankingValue = static_cast<std::int16_t>(rscp + (level.cell == snapshot.servingCell ? 4 : 0));
        umts.cells.push_back(entry);
    }
    emit(buildUmtsSetRecord(umts, timestamp));

    GsmSetRecord gsm;
    gsm.cells.reserve(kMaxGsmNeighbours);
    for (const GsmLevel& level : levels(snapshot).gsm()) {
        if (gsm.cells.size() == kMaxGsmNeighbours) {
            break;
        }
        const SimCell& cell = snapshot.cells[static_cast<std::size_t>(level.cell)];
        gsm.cells.push_back(
            GsmSetCell{static_cast<std::uint16_t>(cell.channel), static_cast<std::uint16_t>(cell.physicalId),
                       static_cast<std::int8_t>(level.rssiDbm), static_cast<std::int16_t>(level.rssiDbm)});
    }
    emit(buildGsmSetRecord(gsm, timestamp));
}

void GsmEmitter::emitCellSets(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                              const BlobOutput& emit) {
    const UmtsLevel* serving = levels(snapshot).umtsLevel(snapshot.servingCell);
    if (serving == nullptr) {
        return;
    }
    const std::uint32_t channel = snapshot.cells[static_cast<std::size_t>(serving->cell)].channel;
    UmtsCellSetRecord record;
    // The carrier's received power: RSSI = trunc((P + 512) / 10) - 106 dBm.
    record.powerReading = static_cast<std::int16_t>(
        std::clamp(std::lround((serving->carrierRssiDbm + 106.0) * 10.0) - 512, -32768L, 32767L));
    record.cells.reserve(kMaxUmtsCells);
    const auto add = [&](const UmtsLevel& level, std::uint8_t setType) {
        const SimCell& cell = snapshot.cells[static_cast<std::size_t>(level.cell)];
        UmtsCellSetCell entry;
        entry.scramblingCode = static_cast<std::uint16_t>(cell.physicalId);
        entry.setType = setType;
        entry.energyReadings = {linearEcio(level.ecioDb), 0, 0};
        record.cells.push_back(entry);
    };
    add(*serving, 0);
    std::size_t active = 1;
    for (const UmtsLevel& level : levels(snapshot).umts()) {
        if (level.cell == serving->cell || record.cells.size() == kMaxUmtsCells) {
            continue;
        }
        const bool sameCarrier = snapshot.cells[static_cast<std::size_t>(level.cell)].channel == channel;
        if (sameCarrier && active < kMaxActiveSet &&
            level.ecioDb >= serving->ecioDb - kSoftHandoverWindowDb) {
            add(level, 0);
            ++active;
        } else {
            add(level, level.ecioDb >= -18.0 ? 1 : 2);  // monitored, or only detected
        }
    }
    emit(buildUmtsCellSetRecord(record, timestamp));
}

void GsmEmitter::emitDchStatistics(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                                   const BlobOutput& emit) {
    const UmtsLevel* serving = levels(snapshot).umtsLevel(snapshot.servingCell);
    if (serving == nullptr) {
        return;
    }
    // Open-loop uplink power: CPICH power - RSCP + UL interference (-103 dBm) + constant (-10 dB).
    UplinkPowerRecord power;
    for (int slot = 0; slot < 5; ++slot) {
        const long txDbm = std::clamp(
            std::lround(kUmtsCpichPowerDbm - serving->rscpDbm - 113.0 + random_.gaussian()), -50L, 24L);
        power.readings.push_back(static_cast<std::int16_t>((txDbm + 70) * 10 - 512));
    }
    emit(buildUplinkPowerRecord(power, timestamp));

    const double bler = blockErrorRatio(serving->ecioDb);
    const auto errorsOf = [&](std::uint32_t blocks) {
        const double mean = blocks * bler;
        const double drawn = mean + std::sqrt(mean * (1.0 - bler)) * random_.gaussian();
        return static_cast<std::uint32_t>(std::clamp(std::lround(drawn), 0L, static_cast<long>(blocks)));
    };
    BlockErrorRecord blocks;
    blocks.windowSize = 100;
    if (snapshot.dataSession) {
        blocks.channels = {{5, 100, errorsOf(100)},
                           {31, 25, errorsOf(25)}};  // PS data on 10 ms, SRB on 40 ms
    } else {
        blocks.channels = {{1, 50, errorsOf(50)},
                           {2, 50, errorsOf(50)},
                           {3, 50, errorsOf(50)},
                           {31, 25, errorsOf(25)}};  // AMR classes A, B, C and the SRB
    }
    emit(buildBlockErrorRecord(blocks, timestamp));

    if (snapshot.dataSession) {
        // Single-carrier HSDPA over six HARQ processes; 500 sub-frames of 2 ms in the second.
        HsdpaRecord hsdpa;
        hsdpa.version = 1;
        hsdpa.subFrames = 500;
        hsdpa.carrier = 0;
        const double scheduled = std::clamp(snapshot.throughputKbps / 7200.0, 0.0, 1.0) * 500.0 / 6.0;
        const std::uint32_t bitsPerProcess =
            static_cast<std::uint32_t>(std::max(0.0, snapshot.throughputKbps) * 1000.0 / 6.0);
        for (std::uint8_t id = 0; id < 6; ++id) {
            const auto newTx = static_cast<std::uint16_t>(std::lround(scheduled));
            hsdpa.primary.push_back(
                HarqProcessEntry{id, bitsPerProcess, newTx, static_cast<std::uint16_t>(errorsOf(newTx))});
        }
        emit(buildHsdpaRecord(hsdpa, timestamp));
    }
}

void GsmEmitter::emitRegistration(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                                  const BlobOutput& emit) {
    RegistrationInfoRecord record;
    record.networkOperatingMode = 1;  // NMO II
    record.serviceType = 3;           // CS and PS service
    const std::string mcc = std::to_string(1000 + snapshot.mcc % 1000).substr(1);
    const std::string mnc = std::to_string(100 + snapshot.mnc % 100).substr(1);
    record.plmnIdentity = plmnIdentityBytes(mcc, mnc);
    record.locationAreaCode = static_cast<std::uint16_t>(registeredLac_);
    record.routingAreaCode = static_cast<std::uint8_t>(registeredRac_);
    emit(buildRegistrationInfoRecord(record, timestamp));

    // The registered PLMN as the one equivalent network: MCC and MNC digits interleaved.
    const std::uint32_t mccValue = snapshot.mcc % 1000;
    const std::uint32_t mncValue = snapshot.mnc % 1000;
    EquivalentPlmnRecord equivalent;
    equivalent.count = 1;
    equivalent.listBytes = {
        static_cast<std::uint8_t>(mccValue / 100),     static_cast<std::uint8_t>(mncValue / 100),
        static_cast<std::uint8_t>(mccValue / 10 % 10), static_cast<std::uint8_t>(mncValue / 10 % 10),
        static_cast<std::uint8_t>(mccValue % 10),      static_cast<std::uint8_t>(mncValue % 10)};
    emit(buildEquivalentPlmnRecord(equivalent, timestamp));
}

void GsmEmitter::emitCellMonitor(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                                 const BlobOutput& emit) {
    const SimCell* serving = servingCell(snapshot);
    std::vector<CellMonitorEntry> entries;
    entries.reserve(1 + kMaxGsmNeighbours + kMaxUmtsCells);
    const std::string gsmTechnology(kKxCellMonitorRadioAccessTechnologyGSM);
    const std::string umtsTechnology(kKxCellMonitorRadioAccessTechnologyUMTS);
    if (serving != nullptr) {
        CellMonitorEntry entry;
        entry.cellType = std::string(kKxCellMonitorCellTypeServing);
        entry.cellId = serving->cellId;
        entry.mcc = snapshot.mcc;
        entry.mnc = snapshot.mnc;
        entry.lac = serving->areaCode;
        if (const GsmLevel* level = levels(snapshot).gsmLevel(snapshot.servingCell)) {
            entry.technology = gsmTechnology;
            entry.arfcn = serving->channel;
            entry.rssi = roundedHalf(level->rssiDbm);
            entries.push_back(std::move(entry));
        } else if (const UmtsLevel* umts = levels(snapshot).umtsLevel(snapshot.servingCell)) {
            entry.technology = umtsTechnology;
            entry.uarfcn = serving->channel;
            entry.psc = serving->physicalId;
            entry.rscp = std::lround(umts->rscpDbm);
            entry.ecn0 = std::lround(umts->ecioDb);
            entries.push_back(std::move(entry));
        }
    }
    std::size_t count = 0;
    for (const GsmLevel& level : levels(snapshot).gsm()) {
        if (level.cell == snapshot.servingCell) {
            continue;
        }
        if (count++ == kMaxGsmNeighbours) {
            break;
        }
        CellMonitorEntry entry;
        entry.technology = gsmTechnology;
        entry.cellType = std::string(kKxCellMonitorCellTypeNeighbor);
        entry.arfcn = snapshot.cells[static_cast<std::size_t>(level.cell)].channel;
        entry.rssi = roundedHalf(level.rssiDbm);
        entries.push_back(std::move(entry));
    }
    count = 0;
    for (const UmtsLevel& level : levels(snapshot).umts()) {
        if (level.cell == snapshot.servingCell) {
            continue;
        }
        if (count++ == kMaxUmtsCells) {
            break;
        }
        const SimCell& cell = snapshot.cells[static_cast<std::size_t>(level.cell)];
        CellMonitorEntry entry;
        entry.technology = umtsTechnology;
        entry.cellType = std::string(kKxCellMonitorCellTypeNeighbor);
        entry.uarfcn = cell.channel;
        entry.psc = cell.physicalId;
        entry.rscp = std::lround(level.rscpDbm);
        entry.ecn0 = std::lround(level.ecioDb);
        entries.push_back(std::move(entry));
    }
    emit(buildCellMonitorEntries(entries, timestamp));
}

void GsmEmitter::emitPdpContexts(bool sessionUp, std::uint64_t timestamp, const BlobOutput& emit) {
    emit(buildPdpSessionRecord(sessionUp, timestamp));
}

}  // namespace velmar::sim
