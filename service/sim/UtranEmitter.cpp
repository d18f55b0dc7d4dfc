#include "service/sim/UtranEmitter.h"

#include <algorithm>
#include <cmath>
#include <string>
#include <vector>

#include "core/platform/KxServerProtocol.h"
#include "logfile/records/UtranRecords.h"
#include "service/sim/PdpSession.h"
#include "service/sim/SimCardFiles.h"

namespace velmar::sim {

namespace {

constexpr Tick kServingPeriod = ticksFromMilliseconds(5000);
constexpr Tick kRefreshPeriod = ticksFromMilliseconds(10000);
constexpr Tick kSimFilesPeriod = ticksFromMilliseconds(10000);
constexpr Tick kPdpPeriod = ticksFromMilliseconds(5000);

constexpr std::size_t kMaxNeighbours = 16;
constexpr std::size_t kMaxGsmNeighbours = 8;
constexpr std::size_t kMaxActiveSet = 3;
constexpr double kSoftHandoverWindowDb = 3.0;
constexpr std::uint8_t kActiveSet = 0, kMonitoredSet = 1, kDetectedSet = 2;

const SimCell* servingOf(const RadioSnapshot& snapshot) {
    if (snapshot.servingCell < 0 || static_cast<std::size_t>(snapshot.servingCell) >= snapshot.cells.size()) {
        return nullptr;
    }
    return &snapshot.cells[static_cast<std::size_t>(snapshot.servingCell)];
}

// Band I duplex spacing: the uplink UARFCN lies 950 below the downlink one.
std::uint16_t uplinkUarfcn(std::uint32_t downlink) {
    return static_cast<std::uint16_t>(downlink > 950 ? downlink - 950 : downlink);
}

// The 7-bit cell parameter id that the neighbour record carries: the scrambling code over four.
std::uint8_t cellParameterId(const SimCell& cell) {
    return static_cast<std::uint8_t>((cell.physicalId >> 2) & 0x7F);
}

// The filtered RSCP of the neighbour record: dB above the -120 dBm floor.
std::uint8_t filteredRscp(double rscpDbm) {
    return static_cast<std::uint8_t>(std::clamp(std::lround(rscpDbm + 120.0), 0L, 255L));
}

double blockErrorRatio(double ecioDb) {
    return std::clamp(0.01 * std::pow(10.0, (-15.0 - ecioDb) / 4.0), 0.001, 0.5);
}

}  // namespace

UtranRrcMode utranRrcMode(const RadioSnapshot& snapshot) {
    if (servingOf(snapshot) == nullptr) {
        return UtranRrcMode::Disconnected;
    }
    switch (snapshot.phase) {
        case ActivityPhase::PowerOn:
            return UtranRrcMode::Disconnected;
        case ActivityPhase::Registering:
            return snapshot.phaseTime < 0.5 ? UtranRrcMode::Connecting : UtranRrcMode::CellDch;
        case ActivityPhase::Idle:
            // With a PDP context kept up the connection rests in CELL_PCH instead of being released.
            return snapshot.dataSession ? UtranRrcMode::CellPch : UtranRrcMode::Disconnected;
        case ActivityPhase::Connecting:
            return UtranRrcMode::Connecting;
        case ActivityPhase::Connected:
            return UtranRrcMode::CellDch;
        case ActivityPhase::Releasing:
            return UtranRrcMode::CellFach;
    }
    return UtranRrcMode::Disconnected;
}

std::unique_ptr<TechnologyEmitter> makeUtranEmitter(SimRandom& random) {
    return std::make_unique<UtranEmitter>(random);
}

UtranEmitter::UtranEmitter(SimRandom& random)
    : random_(random), timers_{TickTimer(kUtranMeasurementPeriod), TickTimer(kUtranChannelQualityPeriod),
                               TickTimer(kServingPeriod),          TickTimer(kRefreshPeriod),
                               TickTimer(kSimFilesPeriod),         TickTimer(kPdpPeriod)} {}

void UtranEmitter::step(const RadioSnapshot& snapshot, const BlobOutput& emit) {
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

    const std::uint64_t timestamp = clock_.timestamp(now);
    if (snapshot.servingCell != lastServing_) {
        lastServing_ = snapshot.servingCell;
        emitServingCell(snapshot, timestamp, emit);
    }
    const UtranRrcMode mode = utranRrcMode(snapshot);
    if (!rrcSent_ || mode != lastRrc_) {
        emitRrcState(mode, timestamp, emit);
    }
    if (snapshot.dataSession != lastDataSession_) {
        lastDataSession_ = snapshot.dataSession;
        emitPdpContexts(snapshot.dataSession, timestamp, emit);
    }
}

const DualModeLevels& UtranEmitter::levels(const RadioSnapshot& snapshot) {
    if (!levelsFresh_) {
        levels_.update(snapshot);
        levelsFresh_ = true;
    }
    return levels_;
}

void UtranEmitter::fire(Timer timer, Tick tick, const RadioSnapshot& snapshot, const BlobOutput& emit) {
    const std::uint64_t timestamp = clock_.timestamp(tick);
    switch (timer) {
        case kMeasurements:
            if (servingOf(snapshot) != nullptr) {
                emitMeasurements(snapshot, timestamp, emit);
                emitCellMonitor(snapshot, timestamp, emit);
            }
            break;
        case kChannelQuality: {
            const UtranRrcMode mode = utranRrcMode(snapshot);
            if (mode == UtranRrcMode::CellDch || mode == UtranRrcMode::CellFach) {
                emitChannelQuality(snapshot, timestamp, emit);
            }
            break;
        }
        case kServing:
            emitServingCell(snapshot, timestamp, emit);
            break;
        case kRefresh:
            emitRrcState(utranRrcMode(snapshot), timestamp, emit);
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

void UtranEmitter::emitRrcState(UtranRrcMode mode, std::uint64_t timestamp, const BlobOutput& emit) {
    rrcSent_ = true;
    lastRrc_ = mode;
    emit(buildUtranRrcStateRecord(UtranRrcStateRecord{1, static_cast<std::uint8_t>(mode), 0}, timestamp));
}

void UtranEmitter::emitServingCell(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                                   const BlobOutput& emit) {
    const SimCell* cell = servingOf(snapshot);
    if (cell == nullptr) {
        return;
    }
    UtranServingCellRecord record;
    record.cellAccessRestrictions = 0;
    record.uraId = static_cast<std::uint8_t>(cell->routingArea);
    record.downlinkUarfcn = static_cast<std::uint16_t>(cell->channel);
    record.uplinkUarfcn = uplinkUarfcn(cell->channel);
    record.cellId = cell->cellId;
    record.emergencyCallsOnly = false;
    emit(buildUtranServingCellRecord(record, timestamp));
}

void UtranEmitter::emitMeasurements(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                                    const BlobOutput& emit) {
    const UmtsLevel* serving = levels(snapshot).umtsLevel(snapshot.servingCell);
    const bool dch = utranRrcMode(snapshot) == UtranRrcMode::CellDch;
    UtranNeighbourMeasurementRecord record;
    record.neighbours.reserve(kMaxNeighbours);
    const auto add = [&](const UmtsLevel& level, std::uint8_t status) {
        const SimCell& cell = snapshot.cells[static_cast<std::size_t>(level.cell)];
        UtranNeighbour entry;
        entry.uarfcn = static_cast<std::uint16_t>(cell.channel & 0x3FFF);
        entry.cellId = cellParameterId(cell);
        entry.filterRscp = filteredRscp(level.rscpDbm);
        entry.status = status;
        entry.inJdcs = status == kActiveSet;
        record.neighbours.push_back(entry);
    };
    std::size_t active = 0;
    if (serving != nullptr) {
        add(*serving, kActiveSet);
        active = 1;
    }
    for (const UmtsLevel& level : levels(snapshot).umts()) {
        if (record.neighbours.size() == kMaxNeighbours) {
            break;
        }
        if (serving != nullptr && level.cell == serving->cell) {
            continue;
        }
        const bool sameCarrier =
            serving != nullptr && snapshot.cells[static_cast<std::size_t>(level.cell)].channel ==
                                      snapshot.cells[static_cast<std::size_t>(serving->cell)].channel;
        if (dch && sameCarrier && active < kMaxActiveSet &&
            level.ecioDb >= serving->ecioDb - kSoftHandoverWindowDb) {
            add(level, kActiveSet);
            ++active;
        } else {
            add(level, level.ecioDb >= -18.0 ? kMonitoredSet : kDetectedSet);
        }
    }
    emit(buildUtranNeighbourMeasurementRecord(record, timestamp));

    UtranGsmNeighbourMeasurementRecord gsm;
    for (const GsmLevel& level : levels(snapshot).gsm()) {
        if (gsm.neighbours.size() == kMaxGsmNeighbours) {
            break;
        }
        const SimCell& cell = snapshot.cells[static_cast<std::size_t>(level.cell)];
        UtranGsmNeighbour entry;
        entry.cellId = static_cast<std::uint16_t>(cell.cellId & 0x3FFF);
        entry.bandIndicator = false;  // DCS 1800 rather than PCS 1900
        entry.bsicValid = true;
        entry.ncc = static_cast<std::uint8_t>((cell.physicalId >> 3) & 0x7);
        entry.bcc = static_cast<std::uint8_t>(cell.physicalId & 0x7);
        entry.arfcn = static_cast<std::uint16_t>(cell.channel);
        entry.rssi = static_cast<std::int16_t>(level.rssiDbm);
        gsm.neighbours.push_back(entry);
    }
    emit(buildUtranGsmNeighbourMeasurementRecord(gsm, timestamp));
}

void UtranEmitter::emitCellMonitor(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                                   const BlobOutput& emit) {
    const std::string technology(kKxCellMonitorRadioAccessTechnologyUTRAN2);
    std::vector<UtranCellMonitorCell> cells;
    cells.reserve(1 + kMaxNeighbours);
    if (const SimCell* serving = servingOf(snapshot)) {
        UtranCellMonitorCell cell;
        cell.technology = technology;
        cell.cellType = std::string(kKxCellMonitorCellTypeServing);
        cell.locationAreaCode = serving->areaCode;
        cell.cellId = serving->cellId;
        cell.bandInfo = serving->band;
        cell.scramblingCode = serving->physicalId;
        cell.uarfcn = serving->channel;
        cells.push_back(std::move(cell));
    }
    for (const UmtsLevel& level : levels(snapshot).umts()) {
        if (level.cell == snapshot.servingCell) {
            continue;
        }
        if (cells.size() == 1 + kMaxNeighbours) {
            break;
        }
        const SimCell& neighbour = snapshot.cells[static_cast<std::size_t>(level.cell)];
        UtranCellMonitorCell cell;
        cell.technology = technology;
        cell.cellType = std::string(kKxCellMonitorCellTypeNeighbor);
        cell.scramblingCode = neighbour.physicalId;
        cell.uarfcn = neighbour.channel;
        cells.push_back(std::move(cell));
    }
    emit(buildUtranCellMonitorRecord(cells, timestamp));
}

void UtranEmitter::emitChannelQuality(const RadioSnapshot& snapshot, std::uint64_t timestamp,
                                      const BlobOutput& emit) {
    const UmtsLevel* serving = levels(snapshot).umtsLevel(snapshot.servingCell);
    if (serving == nullptr) {
        return;
    }
    const double bler = blockErrorRatio(serving->ecioDb);
    // BLER in percent per transport channel, measured over 100 blocks.
    const auto percent = [&]() {
        const double drawn = 100.0 * bler + std::sqrt(100.0 * bler * (1.0 - bler)) * random_.gaussian();
        return static_cast<std::uint8_t>(std::clamp(std::lround(drawn), 0L, 100L));
    };
    UtranChannelQualityRecord record;
    const bool dch = utranRrcMode(snapshot) == UtranRrcMode::CellDch;
    if (dch && snapshot.dataSession) {
        record.transportChannels = {{5, percent()}, {31, percent()}};  // PS data and signalling
    } else if (dch) {
        record.transportChannels = {{1, percent()}, {2, percent()}, {3, percent()}, {31, percent()}};
    } else {
        record.transportChannels = {{33, percent()}};  // FACH
    }
    // One CCTrCH in timeslot 2 with the SIR of its six most recent sub-frames, dB.
    UtranCompositeChannel composite;
    composite.id = 1;
    composite.timeslot = 2;
    for (std::uint8_t& sir : composite.sir) {
        sir = static_cast<std::uint8_t>(
            std::clamp(std::lround(serving->ecioDb + 24.0 + random_.gaussian()), 0L, 40L));
    }
    record.compositeChannels = {composite};
    emit(buildUtranChannelQualityRecord(record, timestamp));
}

void UtranEmitter::emitPdpContexts(bool sessionUp, std::uint64_t timestamp, const BlobOutput& emit) {
    emit(buildPdpSessionRecord(sessionUp, timestamp));
}

}  // namespace velmar::sim
