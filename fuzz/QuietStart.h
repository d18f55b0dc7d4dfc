// QuietStart: the start-up every fuzz target shares. Log lines go to a sink that drops them (syslog would
// flood and slow every run), and standard output goes to /dev/null because class indexes write a line there
// when they go, which would bury libFuzzer's own report (that one goes to standard error).
//
// Contract: call once, from LLVMFuzzerInitialize. threshold is the log threshold to run with: kLogDebug
// formats every line, for targets whose log texts are part of the path under test; the default keeps the
// service's own threshold.
#pragma once

#include <cstdio>
#include <optional>
#include <string>

#include "core/platform/SystemLog.h"

namespace velmar::fuzzing {

inline void quietStart(std::optional<int> threshold = std::nullopt) {
    SystemLog::setSink([](int, const std::string&) {});
    if (threshold) {
        SystemLog::setThreshold(*threshold);
    }
    std::freopen("/dev/null", "w", stdout);
}

}  // namespace velmar::fuzzing
