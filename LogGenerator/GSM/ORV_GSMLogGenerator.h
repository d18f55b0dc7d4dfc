// ORV_GSMLogGenerator: the GSM/UMTS generator of the log-code family: template "ORV_GSM" and a new
// ORV_GSMClassIndex.
//
// Contract: creation logs "Creating ORV_GSMLogGenerator object" (error priority) before any base
// initialisation; destruction logs "ORV_GSMLogGenerator is destructed %p" (warning priority), after which the
// base logs the same text again.
#pragma once

#include <memory>

#include "LogGenerator/ORVLogGenerator2.h"

namespace velmar {

class ORV_GSMLogGenerator : public ORVLogGenerator2 {
  public:
    ORV_GSMLogGenerator();
    ~ORV_GSMLogGenerator() override;

    static std::unique_ptr<LogGenerator> generator();
};

}  // namespace velmar
