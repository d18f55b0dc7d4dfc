#include "LogGenerator/GSM/ORV_GSMLogGenerator.h"

#include "LogGenerator/GSM/ORV_GSMClassIndex.h"
#include "core/platform/SystemLog.h"

namespace velmar {

// Braced initialisation evaluates left to right, so the creation line is logged before the class index
// exists.
ORV_GSMLogGenerator::ORV_GSMLogGenerator()
    : ORVLogGenerator2{announce("Creating ORV_GSMLogGenerator object"), "ORV_GSM",
                       std::make_shared<ORV_GSMClassIndex>()} {}

ORV_GSMLogGenerator::~ORV_GSMLogGenerator() {
    SystemLog::log(kLogWarning, "ORV_GSMLogGenerator is destructed %p", static_cast<void*>(this));
}

std::unique_ptr<LogGenerator> ORV_GSMLogGenerator::generator() {
    return std::make_unique<ORV_GSMLogGenerator>();
}

}  // namespace velmar
