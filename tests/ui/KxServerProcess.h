// KxServerProcess: a real kxserverd for the end-to-end tests of the user interfaces, in its own runtime
// directory, on the simulated baseband of the given technology (or replaying a recording, or another
// source); it can be killed and started again.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "tests/support/BackgroundProcess.h"

namespace velmar::testing {

class KxServerProcess {
  public:
    // extraArguments follow the technology (e.g. {"--rate-multiplier", "10"}); the source is the simulated
    // baseband unless they name another one.
    explicit KxServerProcess(std::string runtimeDirectory, std::string technology = "lte",
                             std::vector<std::string> extraArguments = {});
    // A service replaying a recorded log as fast as the first client takes it.
    static std::unique_ptr<KxServerProcess> replaying(std::string runtimeDirectory, std::string technology,
                                                      const std::string& recording);
    ~KxServerProcess();
    KxServerProcess(const KxServerProcess&) = delete;
    KxServerProcess& operator=(const KxServerProcess&) = delete;

    // Starts the service and waits (up to 5 s) for its control port; false when it did not come up.
    bool start();
    // SIGKILL, as a crashing service would go; waits for the process.
    void kill();
    bool isRunning() const { return process_ != nullptr; }
    // What the running service wrote to standard error (with --log-stderr, its log).
    std::string errorOutput() const { return process_ ? process_->errorOutput() : std::string(); }
    // The command line in use, for messages.
    std::string description() const;

  private:
    std::vector<std::string> arguments() const;

    std::string runtimeDirectory_;
    std::string technology_;
    std::vector<std::string> extraArguments_;
    std::vector<std::string> source_ = {"--source", "sim"};
    std::unique_ptr<BackgroundProcess> process_;
};

}  // namespace velmar::testing
