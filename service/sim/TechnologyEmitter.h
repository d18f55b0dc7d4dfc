// TechnologyEmitter: turns the radio world's snapshots into one technology's baseband blobs, at the rates a
// real baseband of that technology logs them.
//
// Contract: step() is called once per simulation step with non-decreasing snapshot times (the first call
// starts the emitter's schedules) and hands every blob that became due by snapshot.time to emit, in time
// order; a blob is a whole packet as the record builders make it (log type, length, code, timestamp,
// payload), or a property-list blob for the object-based technology. The emitter keeps its own periods and
// counters; given the same snapshots it emits the same bytes (no clock, no global random state: randomness
// comes from the generator it is given).
#pragma once

#include <functional>
#include <memory>
#include <string_view>

#include "core/platform/ByteView.h"
#include "service/sim/RadioSnapshot.h"
#include "service/sim/SimRandom.h"

namespace velmar::sim {

using BlobOutput = std::function<void(ByteView blob)>;

class TechnologyEmitter {
  public:
    virtual ~TechnologyEmitter() = default;
    virtual void step(const RadioSnapshot& snapshot, const BlobOutput& emit) = 0;
};

// The emitter of a technology's short name (core/platform/TechnologyNames.h); null for an unknown name.
std::unique_ptr<TechnologyEmitter> makeTechnologyEmitter(std::string_view technology, SimRandom& random);

}  // namespace velmar::sim
