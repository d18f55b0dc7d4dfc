// LogReadStats: what a log-file reader saw besides the items it produced.
//
// Damage that a reader can step over (a frame with a bad checksum in a capture, a broken snapshot entry) is
// not fatal: it is counted here, the first few messages are kept here, and it is logged as a warning to the
// system log. Each reader fills the counters that apply to its format and leaves the others at zero.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace velmar {

// How many damaged parts a reader describes in LogReadStats::problems (all of them are counted).
inline constexpr std::size_t kMaxReportedProblems = 8;

struct LogReadStats {
    std::uint64_t blobs = 0;  // blob items produced
    std::uint64_t ticks = 0;  // tick items produced

    // Diagnostic-port captures. Every non-empty frame counts once in frames and then in exactly one of
    // logPackets, otherFrames and badFrames; wrappedFrames counts the frames that arrived inside a wrapper.
    std::uint64_t frames = 0;
    std::uint64_t logPackets = 0;
    std::uint64_t otherFrames = 0;
    std::uint64_t badFrames = 0;
    std::uint64_t wrappedFrames = 0;
    // File offsets where the first kMaxReportedProblems bad frames start.
    std::vector<std::uint64_t> badFrameOffsets;

    // Snapshots: history entries holding raw data, and those whose splitting stopped at damaged data.
    std::uint64_t entries = 0;
    std::uint64_t badEntries = 0;

    // Messages for the first kMaxReportedProblems damaged parts that were skipped.
    std::vector<std::string> problems;

    void addProblem(std::string message) {
        if (problems.size() < kMaxReportedProblems) {
            problems.push_back(std::move(message));
        }
    }
};

}  // namespace velmar
