// CdmaEmitter: the CDMA2000 baseband's log records (1x and EV-DO, hybrid mode) from the radio world's
// snapshots.
//
// The device is a hybrid 1x / EV-DO terminal. 1x: Acquisition and Sync while powering on, Paging while
// registering and idle, Traffic during voice calls (the first connection, and later ones that carry no
// data), with the frame erasures of the traffic channel. EV-DO: Acquisition, Sync and Access while the
// session is set up (AMP setup, negotiation, then Open), Idle, Access while a connection is set up and
// Connected during data connections, with the forward and reverse link counters growing with the throughput.
//
// Rates: 1x status (0x119C) and finger C/I (0x108A) every slot cycle of 1.28 s, every 400 ms in traffic;
// traffic frame errors (0x119D) every 100 ms in traffic; system identity (0x134F) every 5.12 s and on every
// change of serving cell; EV-DO status (0x1183) and active set (0x12B6) every 1.28 s; link counters (0x1192,
// 0x127E) every second once the session is open.
//
// Contract: pilot Ec/Io is the cell's pilot (a fifth of its 43 dBm) over the total received power of every
// heard cell plus thermal noise; values are clamped into their fields.
#pragma once

#include <cstdint>
#include <vector>

#include "core/platform/plist/PlistValue.h"
#include "service/sim/PeriodicTimer.h"
#include "service/sim/TechnologyEmitter.h"

namespace velmar::sim {

class CdmaEmitter : public TechnologyEmitter {
  public:
    explicit CdmaEmitter(SimRandom& random);

    void step(const RadioSnapshot& snapshot, const BlobOutput& emit) override;

  private:
    struct Pilot {
        int cell = 0;
        double ecioDb = 0;
        double sinrDb = 0;
    };

    void measure(const RadioSnapshot& snapshot);
    void send(const PlistData& blob, const BlobOutput& emit);
    std::uint8_t oneXState(const RadioSnapshot& snapshot) const;
    std::uint8_t evdoState(const RadioSnapshot& snapshot) const;
    std::uint8_t sessionState(const RadioSnapshot& snapshot) const;
    void emit1xStatus(const RadioSnapshot& snapshot, const BlobOutput& emit);
    void emitFingers(const RadioSnapshot& snapshot, const BlobOutput& emit);
    void emitTrafficFrames(const RadioSnapshot& snapshot, const BlobOutput& emit);
    void emitSystemIdentity(const RadioSnapshot& snapshot, const BlobOutput& emit);
    void emitEvdoStatus(const RadioSnapshot& snapshot, const BlobOutput& emit);
    void emitEvdoActiveSet(const RadioSnapshot& snapshot, const BlobOutput& emit);
    void emitLinkCounters(const RadioSnapshot& snapshot, const BlobOutput& emit);

    SimRandom& random_;
    double receivedDbm_ = -100;
    std::vector<Pilot> activeSet_;  // serving pilot first
    ActivityPhase lastPhase_ = ActivityPhase::PowerOn;
    std::uint32_t connections_ = 0;
    bool voiceCall_ = false;  // the current connection is a 1x voice call (else EV-DO data)
    int lastServing_ = -1;
    std::uint32_t uati24_;
    std::uint8_t colorCode_;
    std::int8_t diversityOffset_;
    std::uint32_t forwardSequence_ = 0;
    std::uint32_t reverseSequence_ = 0;
    std::uint32_t forwardPackets_ = 0;  // 1024-bit packets so far
    std::uint32_t reversePackets_ = 0;
    double forwardRemainder_ = 0;
    double reverseRemainder_ = 0;
    PeriodicTimer status_{1.28};
    PeriodicTimer trafficStatus_{0.4};
    PeriodicTimer trafficFrames_{0.1};
    PeriodicTimer identity_{5.12};
    PeriodicTimer evdoStatus_{1.28, 0.02};
    PeriodicTimer evdoActiveSet_{1.28, 0.04};
    PeriodicTimer linkCounters_{1.0};
};

}  // namespace velmar::sim
