// ProcessStats: what /proc tells of a running process, for tests that bound the CPU and memory a process
// spends under hostile clients (figures, not timings: a spinning loop or an unbounded queue shows in them).
#pragma once

#include <sys/types.h>

#include <cstddef>

namespace velmar::testing {

// User plus system CPU time the process has used so far, in seconds; negative when it cannot be read.
double cpuSecondsOf(pid_t pid);
// Resident memory in KiB; 0 when it cannot be read.
std::size_t residentKibOf(pid_t pid);

}  // namespace velmar::testing
