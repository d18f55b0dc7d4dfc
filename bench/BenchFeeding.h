// BenchFeeding: what the decoder benchmarks share. quietLog() keeps the default threshold (error) but drops
// the lines that pass it instead of sending them to syslog(3), so that figures measure decoding rather than
// the system journal. feedCycle() hands a generator one blob per iteration, round and round a prepared
// stream, refreshing the display every refreshEvery blobs as the monitor's tick would, and reports blobs and
// bytes per second.
#pragma once

#include <benchmark/benchmark.h>

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "LogGenerator/LogGenerator.h"
#include "core/platform/SystemLog.h"

namespace velmar::bench {

inline void quietLog() {
    SystemLog::setSink([](int, const std::string&) {});
    SystemLog::setThreshold(kLogError);
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
