// ServiceProcess: a kxserverd started in the background for a test (see BackgroundProcess), its standard
// error in <directory>/kxserverd.err.
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

}  // namespace velmar::testing
