// BackgroundProcess: a program started in the background for a test, its standard output and standard error
// going to <directory>/<program name>.out and .err, standard input from /dev/null.
//
// The process inherits the test's environment plus the extra assignments given (which replace inherited
// ones of the same name). The destructor kills a process still running and reaps it. Every wait is bounded.
#pragma once

#include <sys/types.h>

#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace velmar::testing {

class BackgroundProcess {
  public:
    BackgroundProcess(const std::string& program, const std::vector<std::string>& arguments,
                      const std::string& directory, const std::vector<std::string>& environment = {});
    ~BackgroundProcess();
    BackgroundProcess(const BackgroundProcess&) = delete;
    BackgroundProcess& operator=(const BackgroundProcess&) = delete;

    pid_t pid() const { return pid_; }
    // Waits until standard error holds text; false when time ran out.
    bool waitForError(const std::string& text, double timeoutSeconds = 30);
    // Waits until holds(everything written to standard output so far); false when time ran out.
    bool waitForOutput(const std::function<bool(const std::string&)>& holds, double timeoutSeconds = 30);
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

// Polls holds every 10 ms until it is true (true) or the time is out (false).
bool waitUntil(const std::function<bool()>& holds, double timeoutSeconds);

// The lines of text.
std::vector<std::string> linesOf(const std::string& text);
// How often what occurs in text (occurrences may overlap).
std::size_t occurrences(const std::string& text, const std::string& what);

}  // namespace velmar::testing
