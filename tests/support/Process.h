// runProcess: runs a program with arguments (no shell), optionally with standard input, and collects its
// exit code and both output streams. exitCode is the exit status, or 128 + signal number when a signal
// ended it.
#pragma once

#include <string>
#include <vector>

namespace velmar::testing {

struct ProcessResult {
    int exitCode = -1;
    std::string out;
    std::string err;
};

ProcessResult runProcess(const std::vector<std::string>& arguments, const std::string& input = std::string(),
                         const std::vector<std::string>& extraEnvironment = {});

}  // namespace velmar::testing
