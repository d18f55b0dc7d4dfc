#include "tests/support/ServiceProcess.h"

#include <algorithm>
#include <string_view>

#include "core/platform/KxServerProtocol.h"
#include "core/platform/MessagePort.h"

namespace velmar::testing {

namespace {

constexpr std::string_view kSystemBusVariable = "DBUS_SYSTEM_BUS_ADDRESS=";

}  // namespace

std::string unreachableSystemBus(const std::string& directory) {
    return "unix:path=" + directory + "/no-system-bus";
}

std::vector<std::string> withoutTheSystemBus(std::vector<std::string> environment,
                                             const std::string& directory) {
    const bool named = std::any_of(environment.begin(), environment.end(), [](const std::string& assignment) {
        return assignment.starts_with(kSystemBusVariable);
    });
    if (!named) {
        environment.push_back(std::string(kSystemBusVariable) + unreachableSystemBus(directory));
    }
    return environment;
}

ServiceProcess::ServiceProcess(const std::vector<std::string>& arguments, const std::string& directory,
                               const std::vector<std::string>& environment)
    : BackgroundProcess(KXSERVERD_PATH, arguments, directory, withoutTheSystemBus(environment, directory)) {}

bool ServiceProcess::waitUntilServing(double timeoutSeconds) {
    bool ended = false;
    const bool serving = waitUntil(
        [&] {
            if (MessagePort::createRemote(std::string(kKxServerControlPortName))) {
                return true;
            }
            ended = waitForExit(0).has_value();
            return ended;
        },
        timeoutSeconds);
    return serving && !ended;
}

}  // namespace velmar::testing
