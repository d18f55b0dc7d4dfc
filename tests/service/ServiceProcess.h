// ServiceProcess: a kxserverd started in the background for a test, with its standard error in a file.
//
// The process inherits the test's environment (VELMAR_RUNTIME_DIR included) plus the extra assignments
// given. The destructor kills a process still running and reaps it. Every wait is bounded.
#pragma once

#include <sys/types.h>

#include <optional>
#include <string>
#include <vector>

namespace velmar::testing {

class ServiceProcess {
  public:
    // arguments exclude the program; directory receives kxserverd.err and kxserverd.out.
    ServiceProcess(const std::vector<std::string>& arguments, const std::string& directory,
                   const std::vector<std::string>& environment = {});
    ~ServiceProcess();
    ServiceProcess(const ServiceProcess&) = delete;
    ServiceProcess& operator=(const ServiceProcess&) = delete;

    pid_t pid() const { return pid_; }
    // Waits until the control port accepts connections; false if the process ended or time ran out.
    bool waitUntilServing(double timeoutSeconds = 30);
    // Waits until standard error holds text; false when time ran out.
    bool waitForError(const std::string& text, double timeoutSeconds = 30);
    std::string errorOutput() const;
    std::string standardOutput() const;
    void sendSignal(int signal);
    // The exit code (128 + signal when a signal ended it), or nullopt when it is still running at the end.
    std::optional<int> waitForExit(double timeoutSeconds = 30);

  private:
    pid_t pid_ = -1;
    std::optional<int> exitCode_;
    std::string errPath_;
    std::string outPath_;
};

// The lines of text.
std::vector<std::string> linesOf(const std::string& text);

}  // namespace velmar::testing
