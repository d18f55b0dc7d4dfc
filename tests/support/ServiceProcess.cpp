#include "tests/support/ServiceProcess.h"

#include "core/platform/KxServerProtocol.h"
#include "core/platform/MessagePort.h"

namespace velmar::testing {

ServiceProcess::ServiceProcess(const std::vector<std::string>& arguments, const std::string& directory,
                               const std::vector<std::string>& environment)
    : BackgroundProcess(KXSERVERD_PATH, arguments, directory, environment) {}

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
