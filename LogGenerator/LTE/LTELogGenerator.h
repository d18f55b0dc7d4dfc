// LTELogGenerator: the log-code generator of the LTE technology, with the "LTE" template and an
// LTEClassIndex.
//
// Contract: creation logs "Creating LTELogGenerator object" (error priority) before any base initialisation;
// destruction logs "LTELogGenerator is destructed %p" (warning priority) before the base's own line.
#pragma once

#include <memory>

#include "LogGenerator/ORVLogGenerator2.h"

namespace velmar {

class LTELogGenerator : public ORVLogGenerator2 {
  public:
    LTELogGenerator();
    ~LTELogGenerator() override;

    static std::unique_ptr<LogGenerator> generator();
};

}  // namespace velmar
