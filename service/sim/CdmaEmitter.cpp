#include "service/sim/CdmaEmitter.h"

#include <algorithm>
#include <cmath>

#include "logfile/records/CdmaRecords.h"

namespace velmar::sim {

namespace {

constexpr double kSectorPowerDbm = 43.0;
constexpr double kPilotFractionDb = -7.0;  // a fifth of the sector's power
constexpr double kNoiseDbm = -108.0;       // thermal noise over 1.23 MHz with a 5 dB noise figure
constexpr double kAddThresholdDb = -14.0;  // T_ADD
constexpr std::size_t kMaxActiveSet = 3;
constexpr std::size_t kFingers = 4;
constexpr std::uint16_t kUnassignedFinger = 65535;
constexpr std::uint16_t kEvdoChannel = 100;
constexpr std::uint8_t kBandClass = 1;
// Active-set energy scaling: with L = 64, M = 1 and Q = 3 the decoded Ec/Io is E / 4608 - 1 / 64.
constexpr std::uint16_t kEnergyL = 64;
constexpr std::uint8_t kEnergyM = 1;
constexpr std::uint8_t kEnergyQ = 3;
// Link counters: every packet is counted in the 1024-bit class (forward counter 3, reverse class 4).
constexpr std::size_t kForwardCounter = 3;
constexpr std::size_t kReverseClass = 4;
constexpr double kPacketBits = 1024.0;
// Subpacket records end with a few bytes of padding after their last subpacket.
constexpr std::size_t kTrailingBytes = 4;

double toLinear(double db) {
    return std::pow(10.0, db / 10.0);
}

template <typename T>
T clampTo(double value, double low, double high) {
    return static_cast<T>(std::lround(std::clamp(value, low, high)));
}

bool sessionOpen(ActivityPhase phase) {
    return phase != ActivityPhase::PowerOn && phase != ActivityPhase::Registering;
}

}  // namespace

CdmaEmitter::CdmaEmitter(SimRandom& random)
    : random_(random),
      uati24_(static_cast<std::uint32_t>(random.integer(0, 0xFFFFFF))),
      colorCode_(static_cast<std::uint8_t>(random.integer(1, 255))),
      diversityOffset_(static_cast<std::int8_t>(random.integer(-3, 3))) {}

void CdmaEmitter::send(const PlistData& blob, const BlobOutput& emit) {
    emit(ByteView(blob.data(), blob.size()));
}

void CdmaEmitter::measure(const RadioSnapshot& snapshot) {
    double received = toLinear(kNoiseDbm);
    for (const HeardCell& heard : snapshot.heard) {
        received += toLinear(kSectorPowerDbm + heard.pathGainDb);
    }
    receivedDbm_ = 10.0 * std::log10(received);
    activeSet_.clear();
    const bool soft = snapshot.phase == ActivityPhase::Connected;
    const auto pilotOf = [&](const HeardCell& heard) {
        const double ior = kSectorPowerDbm + heard.pathGainDb;
        const double others = std::max(received - toLinear(ior), toLinear(kNoiseDbm));
        return Pilot{heard.cell, std::clamp(ior + kPilotFractionDb - receivedDbm_, -31.5, -1.0),
                     std::clamp(ior - 10.0 * std::log10(others), -10.0, 13.0)};
    };
    for (const HeardCell& heard : snapshot.heard) {
        if (heard.cell == snapshot.servingCell) {
            activeSet_.insert(activeSet_.begin(), pilotOf(heard));
        } else if (soft && activeSet_.size() < kMaxActiveSet) {
            const Pilot pilot = pilotOf(heard);
            if (pilot.ecioDb >= kAddThresholdDb) {
                activeSet_.push_back(pilot);
            }
        }
    }
    if (activeSet_.size() > kMaxActiveSet) {
        activeSet_.resize(kMaxActiveSet);
    }
}

std::uint8_t CdmaEmitter::oneXState(const RadioSnapshot& snapshot) const {
    switch (snapshot.phase) {
        case ActivityPhase::PowerOn:
            return snapshot.servingCell < 0 && snapshot.phaseTime < 1.0 ? 3 : 4;  // Acquisition, Sync
        case ActivityPhase::Connected:
            return voiceCall_ ? 8 : 6;  // Traffic, or Paging while EV-DO carries the data
        default:
            return 6;  // Paging
    }
}

std::uint8_t CdmaEmitter::evdoState(const RadioSnapshot& snapshot) const {
    switch (snapshot.phase) {
        case ActivityPhase::PowerOn:
            return snapshot.phaseTime < 1.0 ? 1 : 2;  // Acquisition, Sync
        case ActivityPhase::Registering:
            return 4;  // Access: session set-up
        case ActivityPhase::Connecting:
            return voiceCall_ ? 3 : 4;
        case ActivityPhase::Connected:
            return voiceCall_ ? 3 : 5;
        default:
            return 3;  // Idle
    }
}

std::uint8_t CdmaEmitter::sessionState(const RadioSnapshot& snapshot) const {
    if (snapshot.phase == ActivityPhase::PowerOn) {
        return 0;  // Closed
    }
    if (snapshot.phase == ActivityPhase::Registering) {
        return snapshot.phaseTime < 1.5 ? 1 : 3;  // AMP setup, then negotiation
    }
    return 4;  // Open
}

void CdmaEmitter::step(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    const double now = snapshot.time;
    if (snapshot.phase != lastPhase_) {
        if (snapshot.phase == ActivityPhase::Connecting) {
            ++connections_;
            voiceCall_ = connections_ == 1;
        } else if (snapshot.phase == ActivityPhase::Connected) {
            // The first connection is a voice call; later ones go to EV-DO when they carry data.
            voiceCall_ = connections_ == 1 || snapshot.throughputKbps <= 0;
        }
        lastPhase_ = snapshot.phase;
    }
    measure(snapshot);
    const bool traffic = oneXState(snapshot) == 8;
    if (snapshot.servingCell >= 0) {
        const bool servingChanged = snapshot.servingCell != lastServing_;
        lastServing_ = snapshot.servingCell;
        if (identity_.due(now) || servingChanged) {
            emitSystemIdentity(snapshot, emit);
        }
    }
    if (traffic ? trafficStatus_.due(now) : status_.due(now)) {
        emit1xStatus(snapshot, emit);
        emitFingers(snapshot, emit);
    }
    if (traffic && trafficFrames_.due(now)) {
        emitTrafficFrames(snapshot, emit);
    }
    if (evdoStatus_.due(now)) {
        emitEvdoStatus(snapshot, emit);
    }
    if (snapshot.servingCell >= 0 && evdoActiveSet_.due(now)) {
        emitEvdoActiveSet(snapshot, emit);
    }
    if (sessionOpen(snapshot.phase) && linkCounters_.due(now)) {
        emitLinkCounters(snapshot, emit);
    }
}

void CdmaEmitter::emit1xStatus(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    const std::uint8_t state = oneXState(snapshot);
    const bool traffic = state == 8;
    const SimCell* serving =
        snapshot.servingCell >= 0 ? &snapshot.cells[static_cast<std::size_t>(snapshot.servingCell)] : nullptr;
    const std::uint16_t channel = serving ? static_cast<std::uint16_t>(serving->channel) : 25;

    Cdma1xRadio radio;
    radio.rx0BandClass = kBandClass;
    radio.rx1BandClass = kBandClass;
    radio.rx0Channel = channel;
    radio.rx1Channel = channel;
    // Receive AGC units: dBm = raw × 0.334 - 63.248.
    radio.rxAgc0 = clampTo<std::int8_t>((receivedDbm_ + 63.248) / 0.334, -128, 127);
    radio.rxAgc1 = clampTo<std::int8_t>((receivedDbm_ + diversityOffset_ + 63.248) / 0.334, -128, 127);
    // Open-loop transmit power (-73 dB less the received power) plus the closed loop's small corrections.
    radio.txPower =
        traffic ? clampTo<std::int16_t>((-73.0 - receivedDbm_ + random_.uniform(-1.0, 1.0)) * 10.0, -500, 240)
                : 0;

    Cdma1xActiveSet activeSet;
    activeSet.l = kEnergyL;
    activeSet.m = kEnergyM;
    activeSet.q = kEnergyQ;
    activeSet.f = 1;
    for (const Pilot& pilot : activeSet_) {
        const std::uint16_t pn =
            static_cast<std::uint16_t>(snapshot.cells[static_cast<std::size_t>(pilot.cell)].physicalId);
        const double energy = (toLinear(pilot.ecioDb) + 1.0 / kEnergyL) * 4608.0;
        activeSet.pilots.push_back({pn, clampTo<std::uint16_t>(energy, 0, 65535)});
    }
    activeSet.referencePn = activeSet.pilots.empty() ? 0 : activeSet.pilots.front().pn;

    CdmaSubpacketRecord record;
    record.trailingBytes = kTrailingBytes;
    record.subpackets = {cdma1xStateSubpacket(state), cdma1xRadioSubpacket(radio),
                         cdma1xActiveSetSubpacket(activeSet), cdma1xFingerSubpacket()};
    send(build1xStatusRecord(record, snapshot.basebandTimestamp), emit);
}

void CdmaEmitter::emitFingers(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    FingerC2IRecord record;
    for (const Pilot& pilot : activeSet_) {
        const std::uint16_t pn =
            static_cast<std::uint16_t>(snapshot.cells[static_cast<std::size_t>(pilot.cell)].physicalId);
        // C/I of the finger in 1/512 units.
        record.fingers.push_back({pn, clampTo<std::uint16_t>(512.0 * toLinear(pilot.sinrDb), 1, 65535)});
    }
    while (record.fingers.size() < kFingers) {
        record.fingers.push_back({kUnassignedFinger, 0});
    }
    send(buildFingerC2IRecord(record, snapshot.basebandTimestamp), emit);
}

void CdmaEmitter::emitTrafficFrames(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    const double ecio = activeSet_.empty() ? -20.0 : activeSet_.front().ecioDb;
    // About 1 % of frames are erased on a good link, up to 15 % at the cell edge.
    const double erasureRate = std::clamp(0.01 + 0.02 * (-10.0 - ecio), 0.01, 0.15);
    CdmaSubpacketRecord record;
    record.trailingBytes = kTrailingBytes;
    record.subpackets = {cdma1xTrafficDemodSubpacket(random_.chance(erasureRate))};
    send(build1xTrafficRecord(record, snapshot.basebandTimestamp), emit);
}

void CdmaEmitter::emitSystemIdentity(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    const SimCell& cell = snapshot.cells[static_cast<std::size_t>(snapshot.servingCell)];
    Cdma1xSystemIdentityRecord record;
    record.roamingIndicator = 1;
    record.systemType = 2;
    record.systemId = static_cast<std::uint16_t>(cell.systemId);
    record.networkId = static_cast<std::uint16_t>(cell.networkId);
    record.packetZoneId = static_cast<std::uint8_t>(cell.areaCode);
    record.protocolRevision = 6;
    record.baseId = static_cast<std::uint16_t>(cell.cellId);
    send(build1xSystemIdentityRecord(record, snapshot.basebandTimestamp), emit);
}

void CdmaEmitter::emitEvdoStatus(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    const std::uint8_t state = evdoState(snapshot);
    EvdoStatusRecord record;
    record.channel = kEvdoChannel;
    record.bandClass = kBandClass;
    record.rxAgc0 = clampTo<std::int8_t>(receivedDbm_, -128, 127);
    record.rxAgc1 = clampTo<std::int8_t>(receivedDbm_ + diversityOffset_, -128, 127);
    record.txAgc = state >= 4 ? clampTo<std::int8_t>(-73.0 - receivedDbm_, -60, 24) : 0;
    record.pnOffset = snapshot.servingCell >= 0
                          ? static_cast<std::uint16_t>(
                                snapshot.cells[static_cast<std::size_t>(snapshot.servingCell)].physicalId)
                          : 0xFFFF;
    record.deviceState = state;
    record.sessionState = sessionState(snapshot);
    record.uati24 = uati24_;
    record.colorCode = colorCode_;
    send(buildEvdoStatusRecord(record, snapshot.basebandTimestamp), emit);
}

void CdmaEmitter::emitEvdoActiveSet(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    EvdoActiveSetRecord record;
    for (const Pilot& pilot : activeSet_) {
        const std::uint16_t pn =
            static_cast<std::uint16_t>(snapshot.cells[static_cast<std::size_t>(pilot.cell)].physicalId);
        record.pilots.push_back({pn, clampTo<std::uint16_t>(512.0 * toLinear(pilot.sinrDb), 1, 65535)});
    }
    send(buildEvdoActiveSetRecord(record, snapshot.basebandTimestamp), emit);
}

void CdmaEmitter::emitLinkCounters(const RadioSnapshot& snapshot, const BlobOutput& emit) {
    const bool data = snapshot.phase == ActivityPhase::Connected && !voiceCall_;
    // A second's worth of packets; signalling keeps a trickle going when no data flows.
    const double forwardKbps = data ? std::min(snapshot.throughputKbps, 3100.0) : 0.4;
    const double reverseKbps = data ? std::min(snapshot.throughputKbps * 0.12, 1800.0) : 0.2;
    forwardRemainder_ += forwardKbps * 1000.0 / kPacketBits;
    reverseRemainder_ += reverseKbps * 1000.0 / kPacketBits;
    const double forwardWhole = std::floor(forwardRemainder_);
    const double reverseWhole = std::floor(reverseRemainder_);
    forwardRemainder_ -= forwardWhole;
    reverseRemainder_ -= reverseWhole;
    forwardPackets_ += static_cast<std::uint32_t>(forwardWhole);
    reversePackets_ += static_cast<std::uint32_t>(reverseWhole);
    ++forwardSequence_;
    ++reverseSequence_;

    EvdoForwardLinkRecord forward;
    forward.sequence = forwardSequence_;
    forward.counters[kForwardCounter] = forwardPackets_;
    send(buildEvdoForwardLinkRecord(forward, snapshot.basebandTimestamp), emit);

    EvdoReverseLinkRecord reverse;
    reverse.sequence = reverseSequence_;
    reverse.counters[0][kReverseClass][0] = reversePackets_;
    send(buildEvdoReverseLinkRecord(reverse, snapshot.basebandTimestamp), emit);
}

}  // namespace velmar::sim
