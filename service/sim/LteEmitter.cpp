#include "service/sim/LteEmitter.h"

#include <algorithm>
#include <cmath>

#include "core/platform/KxServerProtocol.h"
#include "logfile/PacketVersionAdapter.h"
#include "logfile/records/GsmRecords.h"
#include "logfile/records/LteRecords.h"
#include "service/sim/SimCardFiles.h"

namespace velmar::sim {

namespace {

// Reference-signal power per resource element: 46 dBm over 1200 subcarriers.
constexpr double kReferenceSignalPowerDbm = 15.2;
constexpr double kSubcarriers = 1200.0;
constexpr double kResourceBlocks = 100.0;
// Thermal noise over 18 MHz with a 7 dB noise figure.
constexpr double kNoiseDbm = -94.4;
constexpr int kQrxlevminDbm = -124;
constexpr std::size_t kMaxIdleNeighbours = 8;
constexpr std::size_t kMaxMeasured = 6;
constexpr std::size_t kMaxDetected = 3;
// Each candidate's technology fields share their bytes with the next candidate's header, so the record
// carries the best candidate alone, which it can describe whole.
constexpr std::size_t kMaxCandidates = 1;
constexpr std::size_t kMaxMonitorNeighbours = 6;
constexpr double kAverageWeight = 0.3;  // layer-3 filter of the averaged levels, per report

// The records are written in the layouts the decoders read, with those layouts' version numbers, so that
// the service's version adapter passes them on as they are.
std::uint8_t decodedVersion(std::uint16_t code) {
    return static_cast<std::uint8_t>(decodedLayoutVersion(code));
}

double toLinear(double dbm) {
    return std::pow(10.0, dbm / 10.0);
}

// A level as a raw field: (value - floor) × steps per dB, rounded and clamped into 0..maxRaw.
std::uint32_t raw(double value, double floor, double stepsPerDb, std::uint32_t maxRaw) {
    const double scaled = std::round((value - floor) * stepsPerDb);
    return static_cast<std::uint32_t>(std::clamp(scaled, 0.0, static_cast<double>(maxRaw)));
}

bool rrcConnected(ActivityPhase phase) {
    return phase == ActivityPhase::Registering || phase == ActivityPhase::Connecting ||
           phase == ActivityPhase::Connected || phase == ActivityPhase::Releasing;
}

bool registered(ActivityPhase phase) {
    return phase != ActivityPhase::PowerOn && phase != ActivityPhase::Registering;
}

}  // namespace

LteEmitter::LteEmitter(SimRandom& random) : random_(random) {}

void LteEmitter::send(const PlistData& blob, const BlobOutput& emit) {
    emit(ByteView(blob.data(), blob.size()));
}

void LteEmitter::measure(const RadioSnapshot& snapshot) {
    if (measured_) {
        return;  // once per step, and only in steps that log levels
    }
    measured_ = true;
    if (levels_.size() != snapshot.cells.size()) {
        levels_.assign(snapshot.cells.size(), CellLevels{});
        traits_.resize(snapshot.cells.size());
        for (CellTraits& traits : traits_) {
            traits.load = random_.uniform(0.05, 0.5);
            traits.frequencyOffset = static_cast<std::uint16_t>(random_.integer(0, 300));
            traits.frameOffset = static_cast<std::uint16_t>(random_.integer(0, 2047));
            traits.sampleOffset = static_cast<std::uint32_t>(random_.integer(0, 0x7FFFF));
        }
    }
    double rssi = toLinear(kNoiseDbm);
    for (const HeardCell& heard : snapshot.heard) {
        const double rsrp = kReferenceSignalPowerDbm + heard.pathGainDb;
        levels_[static_cast<std::size_t>(heard.cell)].rsrp = rsrp;
        // Reference signals take a sixth of the resource elements; data fills the rest as loaded.
        const double load = traits_[static_cast<std::size_t>(heard.cell)].load;
        rssi += toLinear(rsrp) * kSubcarriers * (1.0 / 6.0 + 5.0 / 6.0 * load);
    }
    rssiDbm_ = 10.0 * std::log10(rssi);
    for (const HeardCell& heard : snapshot.heard) {
        CellLevels& level = levels_[static_cast<std::size_t>(heard.cell)];
        level.rsrq = std::clamp(10.0 * std::log10(kResourceBlocks) + level.rsrp - rssiDbm_, -19.5, -3.0);
    }
}

void LteEmitter::step(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    const double now = snapshot.time;
    if (snapshot.servingCell < 0) {
        return;
    }
    measured_ = false;
    const bool servingChanged = snapshot.servingCell != lastServing_;
    lastServing_ = snapshot.servingCell;
    const bool infoDue = servingInfo_.due(now);
    if (servingChanged || infoDue) {
        emitServingCellInfo(snapshot, emit);
        if (servingChanged) {
            servingInfo_.restart(now + 10.24);
        }
    }
    if (!simSent_ || simFiles_.due(now)) {
        simSent_ = true;
        send(buildSimCardRecord(snapshot.basebandTimestamp), emit);
    }
    if (cellMonitor_.due(now) || servingChanged) {
        emitCellMonitor(snapshot, emit);
    }
    const bool connected = rrcConnected(snapshot.phase);
    if (connected != wasConnected_) {
        // The DRX cycle and the measurement period start over with each change of RRC state.
        wasConnected_ = connected;
        intraFrequency_.restart(now);
        idleServing_.restart(now);
        idleNeighbours_.restart(now + 0.04);
        reselection_.restart(now + 0.08);
    }
    if (connected) {
        if (intraFrequency_.due(now)) {
            emitIntraFrequency(snapshot, emit);
        }
    } else {
        if (idleServing_.due(now)) {
            emitIdleServing(snapshot, emit);
        }
        if (idleNeighbours_.due(now)) {
            emitIdleNeighbours(snapshot, emit);
        }
        if (reselection_.due(now) || servingChanged) {
            emitReselectionCandidates(snapshot, emit);
        }
    }
    const int contexts = !registered(snapshot.phase) ? 0 : (snapshot.dataSession ? 2 : 1);
    const bool contextsDue = pdpContexts_.due(now);
    if (contexts != contextsShown_ || (contextsDue && contexts > 0)) {
        contextsShown_ = contexts;
        emitPdpContexts(snapshot, emit);
    }
}

void LteEmitter::emitServingCellInfo(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    const SimCell& cell = snapshot.cells[static_cast<std::size_t>(snapshot.servingCell)];
    LteServingCellInfoRecord info;
    info.version = decodedVersion(kLogCodeLteServingCellInfo);
    info.physicalCellId = static_cast<std::uint16_t>(cell.physicalId);
    info.downlinkEarfcn = static_cast<std::uint16_t>(cell.channel);
    info.uplinkEarfcn = static_cast<std::uint16_t>(cell.channel + 18000);  // the band's duplex spacing
    const std::uint8_t resourceBlocks = static_cast<std::uint8_t>(cell.bandwidthMHz * 5);
    info.downlinkBandwidth = resourceBlocks;
    info.uplinkBandwidth = resourceBlocks;
    info.cellIdentity = cell.cellId;
    info.trackingAreaCode = static_cast<std::uint16_t>(cell.areaCode);
    info.frequencyBandIndicator = cell.band;
    send(buildLteServingCellInfoRecord(info, snapshot.basebandTimestamp), emit);

    LteMasterInformationRecord master;
    master.version = decodedVersion(kLogCodeLteMasterInformation);
    master.physicalCellId = info.physicalCellId;
    master.earfcn = info.downlinkEarfcn;
    master.numTxAntennas = 2;
    send(buildLteMasterInformationRecord(master, snapshot.basebandTimestamp), emit);
}

void LteEmitter::emitIntraFrequency(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    measure(snapshot);
    const SimCell& cell = snapshot.cells[static_cast<std::size_t>(snapshot.servingCell)];
    const CellLevels& serving = levels_[static_cast<std::size_t>(snapshot.servingCell)];
    LteIntraFrequencyRecord record;
    record.version = decodedVersion(kLogCodeLteIntraFrequency);
    record.earfcn = static_cast<std::uint16_t>(cell.channel);
    record.servingPhysicalCellId = static_cast<std::uint16_t>(cell.physicalId);
    // System frame number × 10 + subframe, which wraps at 10240 ms.
    record.subframeNumber =
        static_cast<std::uint16_t>(static_cast<std::uint64_t>(std::llround(snapshot.time * 1000.0)) % 10240);
    record.servingFilteredRsrp = static_cast<std::uint16_t>(raw(serving.rsrp, -140.0, 4.0, 0xFFFF));
    record.servingFilteredRsrq = static_cast<std::uint16_t>(raw(serving.rsrq, -20.0, 8.0, 0xFFFF));
    for (const HeardCell& heard : snapshot.heard) {
        if (heard.cell == snapshot.servingCell) {
            continue;
        }
        const SimCell& neighbour = snapshot.cells[static_cast<std::size_t>(heard.cell)];
        if (neighbour.channel != cell.channel) {
            continue;
        }
        const CellLevels& level = levels_[static_cast<std::size_t>(heard.cell)];
        if (record.measured.size() < kMaxMeasured) {
            record.measured.push_back({static_cast<std::uint16_t>(neighbour.physicalId),
                                       static_cast<std::uint16_t>(raw(level.rsrp, -140.0, 4.0, 0xFFFF)),
                                       static_cast<std::uint16_t>(raw(level.rsrq, -20.0, 8.0, 0xFFFF))});
        } else if (record.detected.size() < kMaxDetected) {
            record.detected.push_back(static_cast<std::uint16_t>(neighbour.physicalId));
        } else {
            break;
        }
    }
    send(buildLteIntraFrequencyRecord(record, snapshot.basebandTimestamp), emit);
}

void LteEmitter::emitIdleServing(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    measure(snapshot);
    const SimCell& cell = snapshot.cells[static_cast<std::size_t>(snapshot.servingCell)];
    CellLevels& serving = levels_[static_cast<std::size_t>(snapshot.servingCell)];
    if (!serving.averaged) {
        serving.averageRsrp = serving.rsrp;
        serving.averageRsrq = serving.rsrq;
        serving.averaged = true;
    }
    serving.averageRsrp += kAverageWeight * (serving.rsrp - serving.averageRsrp);
    serving.averageRsrq += kAverageWeight * (serving.rsrq - serving.averageRsrq);
    const double srxlev = serving.rsrp - kQrxlevminDbm;

    LteIdleServingMeasurementRecord record;
    record.version = decodedVersion(kLogCodeLteIdleServingMeasurement);
    record.earfcn = static_cast<std::uint16_t>(cell.channel);
    record.physicalCellId = static_cast<std::uint16_t>(cell.physicalId);
    record.servingLayerPriority = 5;
    record.measuredRsrp = static_cast<std::uint16_t>(raw(serving.rsrp, -140.0, 4.0, 511));
    record.averageRsrp = static_cast<std::uint16_t>(raw(serving.averageRsrp, -140.0, 4.0, 511));
    record.measuredRsrq = static_cast<std::uint8_t>(raw(serving.rsrq, -30.0, 4.0, 127));
    record.averageRsrq = static_cast<std::uint8_t>(raw(serving.averageRsrq, -30.0, 4.0, 127));
    record.measuredRssi = static_cast<std::uint16_t>(raw(rssiDbm_, -140.0, 2.0, 511));
    record.qrxlevmin = static_cast<std::uint8_t>((kQrxlevminDbm + 140) / 2);
    record.pMax = 23 + 30;
    record.maxUeTxPower = 23 + 30;
    record.srxlev = static_cast<std::uint8_t>(raw(srxlev, -30.0, 1.0, 127));
    record.consecutiveDrxCycles = srxlev < 0 ? 1 : 0;
    record.sIntraSearch = 31;    // 62 dB
    record.sNonIntraSearch = 4;  // 8 dB
    // Intra-frequency measurements are needed below SIntraSearch, the others below SNonIntraSearch.
    record.measurementRules = static_cast<std::uint8_t>((srxlev <= 62 ? 1 : 0) | (srxlev <= 8 ? 2 : 0));
    record.measurementRulesUpdated = false;
    send(buildLteIdleServingMeasurementRecord(record, snapshot.basebandTimestamp), emit);
}

void LteEmitter::emitIdleNeighbours(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    measure(snapshot);
    const SimCell& cell = snapshot.cells[static_cast<std::size_t>(snapshot.servingCell)];
    LteIdleNeighbourMeasurementRecord record;
    record.version = decodedVersion(kLogCodeLteIdleNeighbourMeasurement);
    record.earfcn = static_cast<std::uint16_t>(cell.channel);
    record.qrxlevmin = static_cast<std::uint8_t>((kQrxlevminDbm + 140) / 2);
    for (const HeardCell& heard : snapshot.heard) {
        if (record.neighbours.size() == kMaxIdleNeighbours) {
            break;
        }
        const SimCell& neighbour = snapshot.cells[static_cast<std::size_t>(heard.cell)];
        if (heard.cell == snapshot.servingCell || neighbour.channel != cell.channel) {
            continue;
        }
        CellLevels& level = levels_[static_cast<std::size_t>(heard.cell)];
        if (!level.averaged) {
            level.averageRsrp = level.rsrp;
            level.averageRsrq = level.rsrq;
            level.averaged = true;
        }
        level.averageRsrp += kAverageWeight * (level.rsrp - level.averageRsrp);
        level.averageRsrq += kAverageWeight * (level.rsrq - level.averageRsrq);
        const CellTraits& traits = traits_[static_cast<std::size_t>(heard.cell)];
        LteIdleNeighbour entry;
        entry.physicalCellId = static_cast<std::uint16_t>(neighbour.physicalId);
        entry.measuredRssi = static_cast<std::uint8_t>(raw(rssiDbm_, -140.0, 2.0, 255));
        entry.measuredRsrp = static_cast<std::uint16_t>(raw(level.rsrp, -140.0, 2.0, 511));
        entry.averageRsrp = static_cast<std::uint16_t>(raw(level.averageRsrp, -140.0, 2.0, 511));
        entry.measuredRsrq = static_cast<std::uint8_t>(raw(level.rsrq, -30.0, 4.0, 127));
        entry.averageRsrq = static_cast<std::uint8_t>(raw(level.averageRsrq, -30.0, 4.0, 127));
        entry.srxlev = static_cast<std::uint8_t>(raw(level.rsrp - kQrxlevminDbm, -30.0, 1.0, 127));
        entry.frequencyOffset = traits.frequencyOffset;
        entry.frameOffset = traits.frameOffset;
        entry.sampleOffset = traits.sampleOffset;
        record.neighbours.push_back(entry);
    }
    if (record.neighbours.empty()) {
        return;  // the record cannot say "no cells"; a baseband that hears none logs none
    }
    send(buildLteIdleNeighbourMeasurementRecord(record, snapshot.basebandTimestamp), emit);
}

void LteEmitter::emitReselectionCandidates(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    const SimCell& cell = snapshot.cells[static_cast<std::size_t>(snapshot.servingCell)];
    LteReselectionCandidatesRecord record;
    record.version = 2;
    record.servingEarfcn = static_cast<std::uint16_t>(cell.channel);
    record.servingCellId = static_cast<std::uint16_t>(cell.physicalId);
    for (const HeardCell& heard : snapshot.heard) {
        if (record.candidates.size() == kMaxCandidates) {
            break;
        }
        if (heard.cell == snapshot.servingCell) {
            continue;
        }
        const SimCell& neighbour = snapshot.cells[static_cast<std::size_t>(heard.cell)];
        LteReselectionCandidate candidate;
        candidate.priority = 5;  // the same layer as the serving cell
        candidate.ratType = static_cast<std::uint16_t>(LteCandidateRat::Lte);
        candidate.channel = static_cast<std::uint16_t>(neighbour.channel);
        candidate.cellId = static_cast<std::uint16_t>(neighbour.physicalId);
        record.candidates.push_back(candidate);
    }
    send(buildLteReselectionCandidatesRecord(record, snapshot.basebandTimestamp), emit);
}

void LteEmitter::emitCellMonitor(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    std::vector<LteCellMonitorCell> cells;
    const auto describe = [&snapshot](int index, std::string_view type) {
        const SimCell& cell = snapshot.cells[static_cast<std::size_t>(index)];
        LteCellMonitorCell entry;
        entry.technology = std::string(kKxCellMonitorRadioAccessTechnologyLTE);
        entry.cellType = std::string(type);
        entry.trackingAreaCode = cell.areaCode;
        entry.cellId = cell.cellId;
        entry.physicalCellId = cell.physicalId;
        entry.bandInfo = cell.band;
        entry.uarfcn = cell.channel;
        return entry;
    };
    cells.push_back(describe(snapshot.servingCell, kKxCellMonitorCellTypeServing));
    for (const HeardCell& heard : snapshot.heard) {
        if (cells.size() > kMaxMonitorNeighbours) {
            break;
        }
        if (heard.cell != snapshot.servingCell) {
            LteCellMonitorCell entry = describe(heard.cell, kKxCellMonitorCellTypeNeighbor);
            entry.trackingAreaCode.reset();  // a neighbour's TAC and cell id are not known from measurements
            entry.cellId.reset();
            cells.push_back(entry);
        }
    }
    send(buildLteCellMonitorRecord(cells, snapshot.basebandTimestamp), emit);
}

void LteEmitter::emitPdpContexts(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    std::vector<PdpContext> contexts;
    if (contextsShown_ >= 1) {
        contexts.push_back({5, "internet.test", "IPv4", "10.45.17.201"});
    }
    if (contextsShown_ >= 2) {
        contexts.push_back({6, "data.test", "IPv4v6", "10.45.17.202"});
    }
    send(buildPdpContextsRecord(contexts, snapshot.basebandTimestamp), emit);
}

}  // namespace velmar::sim
