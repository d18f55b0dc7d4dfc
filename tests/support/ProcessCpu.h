// processCpuSeconds: the CPU time (user + system) that a running process has used so far, from
// /proc/<pid>/stat; 0 when it cannot be read. For tests that check a process does not spin, and for the
// benchmarks that report a process's CPU share.
#pragma once

#include <sys/types.h>

namespace velmar::testing {

double processCpuSeconds(pid_t pid);

}  // namespace velmar::testing
