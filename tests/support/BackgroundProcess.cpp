#include "tests/support/BackgroundProcess.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstring>
#include <sstream>
#include <thread>

#include "tests/support/TestPaths.h"

extern char** environ;

namespace velmar::testing {

namespace {

using Clock = std::chrono::steady_clock;

Clock::time_point deadlineAfter(double seconds) {
    return Clock::now() + std::chrono::duration_cast<Clock::duration>(std::chrono::duration<double>(seconds));
}

void pause() {
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
}

}  // namespace

bool waitUntil(const std::function<bool()>& holds, double timeoutSeconds) {
    const auto deadline = deadlineAfter(timeoutSeconds);
    for (;;) {
        if (holds()) {
            return true;
        }
        if (Clock::now() >= deadline) {
            return false;
        }
        pause();
    }
}

namespace {}  // namespace

namespace {

std::string baseName(const std::string& path) {
    const std::size_t slash = path.rfind('/');
    return slash == std::string::npos ? path : path.substr(slash + 1);
}

}  // namespace

BackgroundProcess::BackgroundProcess(const std::string& program, const std::vector<std::string>& arguments,
                                     const std::string& directory,
                                     const std::vector<std::string>& environment)
    : errPath_(directory + "/" + baseName(program) + ".err"),
      outPath_(directory + "/" + baseName(program) + ".out") {
    // Everything the child needs is built before fork: after it, only system calls.
    std::vector<std::string> argumentStrings{program};
    argumentStrings.insert(argumentStrings.end(), arguments.begin(), arguments.end());
    std::vector<char*> argv;
    for (std::string& argument : argumentStrings) {
        argv.push_back(argument.data());
    }
    argv.push_back(nullptr);
    std::vector<std::string> environmentStrings;
    for (char** entry = environ; *entry != nullptr; ++entry) {
        const std::string assignment = *entry;
        const std::string name = assignment.substr(0, assignment.find('='));
        bool overridden = false;
        for (const std::string& extra : environment) {
            overridden = overridden || extra.substr(0, extra.find('=')) == name;
        }
        if (!overridden) {
            environmentStrings.push_back(assignment);
        }
    }
    environmentStrings.insert(environmentStrings.end(), environment.begin(), environment.end());
    std::vector<char*> envp;
    for (std::string& assignment : environmentStrings) {
        envp.push_back(assignment.data());
    }
    envp.push_back(nullptr);

    const int errFd = open(errPath_.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
    const int outFd = open(outPath_.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
    const int nullFd = open("/dev/null", O_RDONLY | O_CLOEXEC);
    pid_ = fork();
    if (pid_ == 0) {
        dup2(nullFd, STDIN_FILENO);
        dup2(outFd, STDOUT_FILENO);
        dup2(errFd, STDERR_FILENO);
        execve(argv[0], argv.data(), envp.data());
        _exit(127);
    }
    close(errFd);
    close(outFd);
    close(nullFd);
}

BackgroundProcess::~BackgroundProcess() {
    if (pid_ > 0 && !exitCode_) {
        kill(pid_, SIGKILL);
        int status = 0;
        waitpid(pid_, &status, 0);
    }
}

bool BackgroundProcess::waitForError(const std::string& text, double timeoutSeconds) {
    return waitUntil([&] { return errorOutput().find(text) != std::string::npos; }, timeoutSeconds);
}

bool BackgroundProcess::waitForOutput(const std::function<bool(const std::string&)>& holds,
                                      double timeoutSeconds) {
    return waitUntil([&] { return holds(standardOutput()); }, timeoutSeconds);
}

std::string BackgroundProcess::errorOutput() const {
    return readWholeFile(errPath_);
}
std::string BackgroundProcess::standardOutput() const {
    return readWholeFile(outPath_);
}

void BackgroundProcess::sendSignal(int signal) {
    if (pid_ > 0 && !exitCode_) {
        kill(pid_, signal);
    }
}

std::optional<int> BackgroundProcess::waitForExit(double timeoutSeconds) {
    if (exitCode_ || pid_ <= 0) {
        return exitCode_;
    }
    const auto deadline = deadlineAfter(timeoutSeconds);
    for (;;) {
        int status = 0;
        const pid_t done = waitpid(pid_, &status, WNOHANG);
        if (done == pid_) {
            exitCode_ = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
            return exitCode_;
        }
        if (Clock::now() >= deadline) {
            return std::nullopt;
        }
        pause();
    }
}

std::vector<std::string> linesOf(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) {
        lines.push_back(line);
    }
    return lines;
}

std::size_t occurrences(const std::string& text, const std::string& what) {
    std::size_t count = 0;
    for (std::size_t at = text.find(what); at != std::string::npos; at = text.find(what, at + 1)) {
        ++count;
    }
    return count;
}

}  // namespace velmar::testing
