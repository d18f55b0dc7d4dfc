#include "LogGenerator/LTE/LTELogGenerator.h"

#include "LogGenerator/LTE/LTEClassIndex.h"
#include "core/platform/SystemLog.h"

namespace velmar {

// Braces: the creation line is logged before the class index (and its decoders) exist.
LTELogGenerator::LTELogGenerator()
    : ORVLogGenerator2{announce("Creating LTELogGenerator object"), "LTE",
                       std::make_shared<LTEClassIndex>()} {}

LTELogGenerator::~LTELogGenerator() {
    SystemLog::log(kLogWarning, "LTELogGenerator is destructed %p", static_cast<void*>(this));
}

std::unique_ptr<LogGenerator> LTELogGenerator::generator() {
    return std::make_unique<LTELogGenerator>();
}

}  // namespace velmar
