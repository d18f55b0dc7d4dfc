// RadioSnapshot: what the simulated device hears and does at one instant of simulated time. The radio world
// (cells, route, propagation, procedures) produces one per simulation step; a technology's emitter turns it
// into that technology's records. It is plain data so that emitters can be tested with hand-made snapshots.
//
// Contract: `cells` lists every cell of the world in a fixed order (index = position), with the identities of
// the technology being simulated. `heard` lists the cells whose path gain is above the world's hearing
// threshold, strongest first; `servingCell` is an index into `cells` (always heard while camped). Levels are
// path gains in dB (negative: distance loss, log-normal shadowing and fast fading together), so that each
// emitter applies its own transmit power, bandwidth and noise. Values change smoothly between steps.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace velmar::sim {

// One cell of the world with the identities of the simulated technology. Fields a technology has no use for
// are still filled consistently (an emitter takes what its records carry).
enum class CellRat : std::uint8_t { Gsm, Umts, Lte, Cdma };

struct SimCell {
    int index = 0;
    CellRat rat = CellRat::Lte;      // a dual-mode world (gsm technology) mixes GSM and UMTS cells
    std::uint32_t cellId = 0;        // 28-bit E-UTRAN/UTRAN cell id, 16-bit GSM CI, CDMA base id
    std::uint32_t areaCode = 0;      // TAC (LTE), LAC (GSM/UMTS), packet zone (CDMA)
    std::uint32_t routingArea = 0;   // RAC (GSM/UMTS)
    std::uint32_t channel = 0;       // EARFCN, UARFCN, ARFCN or CDMA channel number
    std::uint32_t physicalId = 0;    // PCI (0..503), PSC (0..511), BSIC (0..63) or PN offset (0..511)
    std::uint32_t band = 0;          // LTE band, UMTS band, GSM band index or CDMA band class
    std::uint32_t bandwidthMHz = 0;  // LTE channel bandwidth (1.4 shown as 1), 5 for UMTS, 0 otherwise
    std::uint32_t systemId = 0;      // CDMA SID
    std::uint32_t networkId = 0;     // CDMA NID
    double x = 0, y = 0;             // site position in metres
};

struct HeardCell {
    int cell = 0;             // index into RadioSnapshot::cells
    double pathGainDb = 0;    // total gain from the cell's transmitter to the device, e.g. -95.3
    double fastFadingDb = 0;  // the fast-fading part of pathGainDb alone (for quality figures)
};

// The device's activity, in terms every technology shares; emitters map it to their own state names.
enum class ActivityPhase : std::uint8_t {
    PowerOn,      // searching, not yet camped
    Registering,  // attach / location or tracking-area update in progress
    Idle,         // camped, listening to paging
    Connecting,   // connection establishment
    Connected,    // dedicated / connected mode, data may flow
    Releasing,    // connection release
};

struct RadioSnapshot {
    double time = 0;                      // simulated seconds since the baseband started
    std::uint64_t basebandTimestamp = 0;  // the packet timestamp: 1/800 s since 1980-01-06 << 16
    std::uint32_t mcc = 1, mnc = 1;       // the PLMN, 001-01 (a test network)
    std::vector<SimCell> cells;
    std::vector<HeardCell> heard;
    int servingCell = -1;               // -1 before the first camp
    int previousServingCell = -1;       // the serving cell before the last reselection or handover
    std::uint32_t servingChanges = 0;   // reselections and handovers so far
    bool handoverJustHappened = false;  // the serving cell changed in connected mode at this step
    ActivityPhase phase = ActivityPhase::PowerOn;
    double phaseTime = 0;       // seconds spent in the current phase
    bool dataSession = false;   // a packet-data context is up
    double throughputKbps = 0;  // downlink user data rate while connected (0 otherwise)
    double speedMetresPerSecond = 0;
    double x = 0, y = 0;  // device position in metres
};

}  // namespace velmar::sim
