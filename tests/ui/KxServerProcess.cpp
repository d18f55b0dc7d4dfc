#include "tests/ui/KxServerProcess.h"

#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <utility>

#include "tests/support/ServiceProcess.h"

namespace velmar::testing {

namespace {

constexpr const char* kControlPort = "com.velmar.kxserver";

bool exists(const std::string& path) {
    struct stat info {};
    return stat(path.c_str(), &info) == 0;
}

// Starts kxserverd with arguments in runtimeDirectory and waits for its control port; null when it ended
// or did not open the port in time.
std::unique_ptr<BackgroundProcess> startService(const std::vector<std::string>& arguments,
                                                const std::string& runtimeDirectory, double seconds) {
    // A killed service leaves its socket file behind; the new one must be waited for, not the old file.
    unlink((runtimeDirectory + "/" + kControlPort).c_str());
    auto process = std::make_unique<BackgroundProcess>(
        KXSERVERD_PATH, arguments, runtimeDirectory,
        withoutTheSystemBus({"VELMAR_RUNTIME_DIR=" + runtimeDirectory}, runtimeDirectory));
    const bool up = waitUntil(
        [&] { return exists(runtimeDirectory + "/" + kControlPort) || process->waitForExit(0).has_value(); },
        seconds);
    if (!up || process->waitForExit(0).has_value()) {
        return nullptr;
    }
    return process;
}

}  // namespace

KxServerProcess::KxServerProcess(std::string runtimeDirectory, std::string technology,
                                 std::vector<std::string> extraArguments)
    : runtimeDirectory_(std::move(runtimeDirectory)),
      technology_(std::move(technology)),
      extraArguments_(std::move(extraArguments)) {}

KxServerProcess::~KxServerProcess() {
    if (process_) {
        process_->sendSignal(SIGTERM);
        process_->waitForExit(5);
    }
}

std::unique_ptr<KxServerProcess> KxServerProcess::replaying(std::string runtimeDirectory,
                                                            std::string technology,
                                                            const std::string& recording) {
    auto process = std::make_unique<KxServerProcess>(std::move(runtimeDirectory), std::move(technology));
    process->source_ = {"--source", "replay", "--input", recording, "--fast"};
    return process;
}

std::vector<std::string> KxServerProcess::arguments() const {
    const bool sourceGiven =
        std::find(extraArguments_.begin(), extraArguments_.end(), "--source") != extraArguments_.end();
    std::vector<std::string> arguments = sourceGiven ? std::vector<std::string>{} : source_;
    arguments.insert(arguments.end(), {"--technology", technology_});
    arguments.insert(arguments.end(), extraArguments_.begin(), extraArguments_.end());
    return arguments;
}

std::string KxServerProcess::description() const {
    std::string text = KXSERVERD_PATH;
    for (const std::string& argument : arguments()) {
        text += " " + argument;
    }
    return text;
}

bool KxServerProcess::start() {
    if (!process_) {
        process_ = startService(arguments(), runtimeDirectory_, 5.0);
    }
    return process_ != nullptr;
}

void KxServerProcess::kill() {
    if (process_) {
        process_->sendSignal(SIGKILL);
        process_->waitForExit(5);
        process_.reset();
    }
}

}  // namespace velmar::testing
