// ServiceProcess: a kxserverd started in the background for a test (see BackgroundProcess), its standard
// error in <directory>/kxserverd.err.
//
// No test reaches the machine's system bus (and a ModemManager that may be on it): unless the environment
// given names DBUS_SYSTEM_BUS_ADDRESS, the service's system bus is a socket in directory that never exists.
#pragma once

#include <string>
#include <vector>

#include "tests/support/BackgroundProcess.h"

namespace velmar::testing {

class ServiceProcess : public BackgroundProcess {
  public:
    // arguments exclude the program.
    ServiceProcess(const std::vector<std::string>& arguments, const std::string& directory,
                   const std::vector<std::string>& environment = {});

    // Waits until the control port accepts connections; false if the process ended or time ran out.
    bool waitUntilServing(double timeoutSeconds = 30);
};

// The address of a bus socket in directory that never exists.
std::string unreachableSystemBus(const std::string& directory);
// environment, plus DBUS_SYSTEM_BUS_ADDRESS=unreachableSystemBus(directory) when it does not assign
// DBUS_SYSTEM_BUS_ADDRESS itself.
std::vector<std::string> withoutTheSystemBus(std::vector<std::string> environment,
                                             const std::string& directory);

}  // namespace velmar::testing
