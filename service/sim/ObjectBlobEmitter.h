// ObjectBlobEmitter: the blobs of an object-based GSM baseband ("ifx"), made from the radio world's
// snapshots. Such a baseband sends no log packets: once a second it sends one binary property list holding
// the whole picture as nested groups of string values: the serving cell, the neighbour list, the protocol
// states and the PLMN.
//
// Contract: the first blob goes out with the first snapshot, then one every second of simulated time, each
// describing the snapshot at hand. Every leaf is a string (the receiving generator accepts nothing else);
// figures come from DualModeLevels, so they agree with what the log-code GSM emitter reports for the same
// world. Nothing here is random.
#pragma once

#include <memory>
#include <string>

#include "core/platform/plist/PlistValue.h"
#include "service/sim/DualModeLevels.h"
#include "service/sim/EmitterSchedule.h"
#include "service/sim/TechnologyEmitter.h"

namespace velmar::sim {

inline constexpr Tick kObjectBlobPeriod = ticksFromMilliseconds(1000);

class ObjectBlobEmitter final : public TechnologyEmitter {
  public:
    explicit ObjectBlobEmitter(SimRandom& random);
    void step(const RadioSnapshot& snapshot, const BlobOutput& emit) override;

    // The tree that a blob carries for the snapshot (the levels must have been updated from it).
    PlistValue pictureOf(const RadioSnapshot& snapshot) const;

  private:
    DualModeLevels levels_;
    bool started_ = false;
    TickTimer timer_{kObjectBlobPeriod};
};

// The state names that the object-based baseband shows for an activity.
std::string objectRrState(const RadioSnapshot& snapshot);
std::string objectMmState(const RadioSnapshot& snapshot);
std::string objectGmmState(const RadioSnapshot& snapshot);

std::unique_ptr<TechnologyEmitter> makeObjectBlobEmitter(SimRandom& random);

}  // namespace velmar::sim
