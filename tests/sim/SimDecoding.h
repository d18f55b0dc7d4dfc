// SimDecoding: runs the simulated baseband of a technology and decodes everything it produces with that
// technology's real generator, the way the monitor does: every blob goes to updateState on one fresh state,
// and generateLogUsingState runs once per simulated second (and once more at the end).
//
// The suites of every technology use it to check what the simulator's records fill in. It keeps the blobs
// (to compare runs and to look at single records) and one snapshot of the radio world per simulated second.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "LogGenerator/LogGenerator.h"
#include "core/platform/plist/PlistValue.h"
#include "service/sim/RadioSnapshot.h"
#include "service/sim/SimulatedBaseband.h"

namespace velmar::testing {

struct SimDecodingSettings {
    std::string technology = "lte";  // gsm, lte, utran, cdma or ifx
    std::uint64_t seed = 1;
    sim::Scenario scenario = sim::Scenario::Drive;
    double seconds = 30.0;
    // 2026-01-01 00:00:00 UTC in baseband units, so that runs do not depend on the day they run.
    std::uint64_t startTimestamp = kDefaultStartTimestamp;
    bool decode = true;  // false: only run the simulator (blobs and snapshots)

    static constexpr std::uint64_t kDefaultStartTimestamp = ((1767225600ULL - 315964800ULL) * 800ULL) << 16;
};

struct SimDecodingResult {
    std::unique_ptr<LogGenerator> generator;    // null when decode was false or the technology has none
    StateDict state;                            // the generator's state after the last refresh
    std::vector<PlistData> blobs;               // every blob, in order
    std::vector<sim::RadioSnapshot> snapshots;  // the world at 0, 1, 2, ... simulated seconds

    // The state's "Display" (null before the first refresh).
    PlistValue display() const;
};

SimDecodingResult runSimDecoding(const SimDecodingSettings& settings);

// The "GetTechnology" constant of a technology name ("lte" -> "kKxLogChannelTechnology_Orvane_LTE").
std::string_view technologyConstantOf(std::string_view name);

// The value stored under key at any depth of a display tree (the first one found, depth first in
// dictionary order), or null.
PlistValue findInDisplay(const PlistValue& tree, std::string_view key);

// The log code of a packet blob: the 16-bit code at 3, plus 0xFF0000 for an extended packet.
std::int32_t logCodeOf(const PlistData& blob);

}  // namespace velmar::testing
