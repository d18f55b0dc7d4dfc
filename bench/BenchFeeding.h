// BenchFeeding: what the decoder benchmarks share. quietLog() keeps the default threshold (error) but drops
// the lines that pass it instead of sending them to syslog(3), so that figures measure decoding rather than
// the system journal. mixedCaptureBlobs() holds the blobs of samples/captures/mixed-large-1.qmdl. feedCycle()
// hands a generator one blob per iteration, round and round a prepared stream, refreshing the display every
// refreshEvery blobs as the monitor's tick would, and reports blobs and bytes per second.
#pragma once

#include <benchmark/benchmark.h>

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "LogGenerator/LogGenerator.h"
#include "core/platform/SystemLog.h"
#include "logfile/LogFormat.h"

namespace velmar::bench {

inline void quietLog() {
    SystemLog::setSink([](int, const std::string&) {});
    SystemLog::setThreshold(kLogError);
}

// The blobs of the mixed-large-1 capture, read once per program.
inline const std::vector<PlistData>& mixedCaptureBlobs() {
    static const std::vector<PlistData> blobs = [] {
        std::vector<PlistData> out;
        const LogReadResult result =
            readLogFile(std::string(VELMAR_SOURCE_DIR) + "/samples/captures/mixed-large-1.qmdl");
        for (const LogItem& item : result.items) {
            if (item.isBlob()) {
                out.push_back(item.bytes);
            }
        }
        return out;
    }();
    return blobs;
}

inline void feedCycle(benchmark::State& state, LogGenerator& generator, const std::vector<PlistData>& blobs,
                      std::size_t refreshEvery = 100) {
    quietLog();
    const StateDict stateDict = PlistDictionary::create();
    std::size_t next = 0;
    std::size_t sinceRefresh = 0;
    std::size_t bytes = 0;
    for (auto _ : state) {
        generator.updateState(stateDict, blobs[next]);
        bytes += blobs[next].size();
        next = next + 1 == blobs.size() ? 0 : next + 1;
        if (++sinceRefresh == refreshEvery) {
            sinceRefresh = 0;
            generator.generateLogUsingState(stateDict);
        }
    }
    state.SetItemsProcessed(state.iterations());
    state.SetBytesProcessed(static_cast<std::int64_t>(bytes));
}

}  // namespace velmar::bench
